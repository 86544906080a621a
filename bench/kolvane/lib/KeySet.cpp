#include "bench/kolvane/lib/KeySet.h"

#include <fmt/format.h>

#include <algorithm>
#include <boost/locale/encoding_utf.hpp>
#include <boost/unordered/unordered_flat_set.hpp>
#include <random>
#include <span>
#include <stdexcept>

namespace {

using Random = std::mt19937_64;

constexpr size_t kMostMissingKeys = 100'000;

constexpr std::string_view kSegments[] = {
    "Dialog",  "Menu",      "Panel",    "Export",    "Import",   "Settings",  "Preferences",
    "Tool",    "Layer",     "Document", "Window",    "Help",     "Error",     "Warning",
    "Title",   "Label",     "Button",   "Tooltip",   "Status",   "Progress",  "Colour",
    "Font",    "Paragraph", "Image",    "Network",   "Printer",  "Filter",    "Palette",
    "History", "Account",   "Template", "Script",    "Database", "Selection", "Keyboard",
    "View",    "Edit",      "File",     "Animation", "Update"};

constexpr std::string_view kEnglish[] = {
    "open",  "the",      "selected", "file",   "cannot", "save",  "change", "colour",
    "of",    "document", "and",      "close",  "window", "print", "all",    "pages",
    "apply", "filter",   "new",      "folder", "delete", "this",  "layer",  "now"};

constexpr std::string_view kFrench[] = {
    "ouvrir",     "le",         "fichier",  "sélectionné", "impossible", "d’enregistrer",
    "modifier",   "la",         "couleur",  "du",          "document",   "et",
    "fermer",     "fenêtre",    "imprimer", "toutes",      "pages",      "appliquer",
    "filtre",     "nouveau",    "dossier",  "supprimer",   "ce",         "calque",
    "maintenant", "créer",      "à",        "partir",      "modèle",     "français",
    "été",        "paramètres", "réseau",   "œuvre",       "déjà"};

// Not uniform_int_distribution, whose results differ between libraries. The bias is negligible.
size_t Draw(Random& random, size_t low, size_t high) {
  return low + random() % (high - low + 1);
}

std::string_view DrawWord(Random& random, std::span<const std::string_view> words) {
  return words[Draw(random, 0, words.size() - 1)];
}

// Appends words until there are `length` bytes.
std::string DrawText(Random& random, std::span<const std::string_view> words, size_t length) {
  std::string text(DrawWord(random, words));
  while (text.size() < length) {
    text += ' ';
    text += DrawWord(random, words);
  }
  return text;
}

std::string DrawPath(Random& random) {
  std::string path;
  for (size_t left = Draw(random, 2, 5); left > 0; --left) {
    path += '/';
    path += DrawWord(random, kSegments);
  }
  return path + std::to_string(Draw(random, 0, 999'999));
}

PackedTexts<char> MixedPaths(Random& random, size_t count) {
  boost::unordered_flat_set<std::string> seen;
  PackedTexts<char> paths;
  while (paths.Count() < count) {
    const std::string path = DrawPath(random);
    const bool fits = path.size() >= 25 && path.size() <= 60;
    if (fits && seen.insert(path).second) paths.Append(path);
  }
  return paths;
}

// The digits are between the bytes that the format's hash samples, so all keys have one bucket.
PackedTexts<char> OnePattern(size_t count) {
  PackedTexts<char> keys;
  for (size_t i = 0; i < count; ++i) {
    keys.Append(fmt::format("/App/Section/Item{:07}/Dialog/Headline", i));
  }
  return keys;
}

// Takes missing keys from the whole range, so that they sort between the others.
void AddSyntheticEntries(KeySet& set, const PackedTexts<char>& keys, size_t size, Random& random) {
  const size_t all = keys.Count(), missing = all - size;
  for (size_t i = 0; i < all; ++i) {
    if (i * missing / all != (i + 1) * missing / all) {
      set.missingKeys.Append(keys[i]);
    } else {
      AddEntry(set, keys[i], DrawText(random, kFrench, Draw(random, 5, 45)));
    }
  }
}

void AddMissingIsoCodes(KeySet& set) {
  for (size_t i = 0; i < set.Size(); ++i) set.missingKeys.Append(fmt::format("{}~", set.keys[i]));
}

void AddDefaultTexts(KeySet& set, Random& random) {
  const auto draw = [&] { return DrawText(random, kEnglish, Draw(random, 8, 30)); };
  for (size_t i = 0; i < set.keys.Count(); ++i) set.defaultTexts.Append(draw());
  for (size_t i = 0; i < set.missingKeys.Count(); ++i) set.missingDefaults.Append(draw());
}

}  // namespace

const std::vector<std::string>& KeySetNames() {
  static const std::vector<std::string> names = {"mixed-paths", "one-pattern", "iso-codes"};
  return names;
}

void AddEntry(KeySet& set, std::string_view key, std::string_view valueInUTF8) {
  set.keys.Append(key);
  set.valuesInUTF8.Append(valueInUTF8);
  set.values.Append(boost::locale::conv::utf_to_utf<char16_t>(
      valueInUTF8.data(), valueInUTF8.data() + valueInUTF8.size()));
}

KeySet MakeKeySet(const std::string& name, size_t size) {
  KeySet set;
  set.name = name;
  Random random(20'220'601);
  const size_t withMissing = size + std::min(size, kMostMissingKeys);
  if (name == "mixed-paths") {
    AddSyntheticEntries(set, MixedPaths(random, withMissing), size, random);
  } else if (name == "one-pattern") {
    AddSyntheticEntries(set, OnePattern(withMissing), size, random);
  } else if (name == "iso-codes") {
    AddIsoCodes(set);
    AddMissingIsoCodes(set);
  } else {
    throw std::invalid_argument("no such key set: " + name);
  }
  AddDefaultTexts(set, random);
  return set;
}
