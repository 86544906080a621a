#include "tools/kolvane/lint/ImageCheck.h"

#include <fmt/format.h>

#include <algorithm>
#include <optional>
#include <span>
#include <string_view>
#include <unordered_map>
#include <utility>

#include "kolvane/lib/BinaryParser.h"
#include "kolvane/lib/ByteStreams.h"
#include "kolvane/lib/DictionaryTable.h"
#include "kolvane/lib/StoredGroups.h"
#include "platform/SeededHash.h"
#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/lint/Rules.h"
#include "tools/kolvane/text/UTF8.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

using tovali_private::StoredEntry;
using tovali_private::StoredGroup;
using Bytes = std::span<const uint8_t>;

struct DamageRule {
  LoadDamage damage;
  const Rule* rule;
  const char* message;
};

constexpr DamageRule kDamageRules[] = {
    {LoadDamage::kShortRead, &rules::kTruncatedImage, "what begins here is not all there"},
    {LoadDamage::kUnsupportedVersion, &rules::kUnsupportedVersion,
     "this version of the binary format is neither 1.0 nor 1.5"},
    {LoadDamage::kNoGroups, &rules::kDamagedImage, "the count of groups is 0"},
    {LoadDamage::kBadCounts, &rules::kDamagedImage, "a group's count is odd or decreases"},
    {LoadDamage::kBadBucket, &rules::kDamagedImage,
     "there is no such bucket; the group's entries are dropped"},
    {LoadDamage::kBadOffset, &rules::kDamagedImage, "a group does not end at its offset"}};

// The first place in a stored value that is no character, and why.
struct BadCharacter {
  size_t at;
  std::string message;
};

std::optional<BadCharacter> BadCharacterIn(Bytes value, TextEncoding encoding) {
  if (encoding == TextEncoding::kUTF8) {
    const auto at = MalformedUTF8At(AsText(value));
    if (!at) return std::nullopt;
    return BadCharacter{*at, "a byte of the value is no UTF-8"};
  }
  if (encoding != TextEncoding::kUTF16LE) return std::nullopt;
  if (value.size() % 2 != 0) {
    return BadCharacter{value.size() - 1, "the value ends in half of a character"};
  }
  const std::vector<uint16_t> units = UnitsOf(value);
  for (size_t at = 0; at < units.size();) {
    const char32_t codePoint = CodePointAt(units, at);
    if (IsSurrogate(codePoint)) {
      return BadCharacter{
          2 * at, fmt::format("{} in the value is half of a character", CodePointText(codePoint))};
    }
    at += UnitCount(codePoint);
  }
  return std::nullopt;
}

tovali_private::ParsedImage Parse(const ImageFile& file) {
  tovali_private::MemoryInput stream(file.bytes);
  return tovali_private::ParseBinary(stream);
}

class ImageCheck {
 public:
  ImageCheck(const ImageFile& checked, std::vector<Finding>& list)
      : file(checked), findings(list), parsed(Parse(checked)) {}

  Definitions Run() {
    CheckDamage();
    parsed.stored.ForEachEntry(
        [this](const StoredGroup& group, const StoredEntry& entry) { CheckEntry(group, entry); });
    return std::move(definitions);
  }

 private:
  void CheckDamage() {
    for (const DamageRule& each : kDamageRules) {
      if (each.damage != parsed.damage.kind) continue;
      Report(*each.rule,
             Place{.file = file.name, .hasOffset = true, .offset = parsed.damage.offset}, "",
             each.message);
    }
  }

  void CheckEntry(const StoredGroup& group, const StoredEntry& entry) {
    ++number;
    if (group.bucket >= DictionaryTable::kBucketCount) return;
    const std::string key(AsText(entry.key));
    CheckKey(key, entry);
    if (const auto bad = BadCharacterIn(entry.value, parsed.encoding)) {
      Place place = PlaceOf(entry);
      place.offset += entry.key.size() + parsed.stored.lengthsBetween / 2 + bad->at;
      Report(rules::kMalformedInput, std::move(place), key, bad->message);
    }
    const uint32_t due = entry.Key().Hash(DictionaryTable::kBucketCount);
    if (due != group.bucket) {
      Report(rules::kMisfiledEntry, PlaceOf(entry), key,
             fmt::format("no lookup finds '{}': it lies in bucket {}, not in {}", Shown(key),
                         group.bucket, due));
      return;
    }
    Define(group, entry, key);
  }

  void CheckKey(const std::string& key, const StoredEntry& entry) {
    const char* fault = nullptr;
    if (!IsValidUTF8(key)) fault = "no lookup in UTF-8 matches '{}', which is none";
    if (key.find('\0') != key.npos) fault = "no lookup matches '{}': it holds a zero character";
    if (key.find('=') != key.npos) fault = "no lookup matches '{}': it holds '='";
    if (fault != nullptr) {
      Report(rules::kUnmatchableKey, PlaceOf(entry), key,
             fmt::format(fmt::runtime(fault), Shown(key)));
    } else if (key.empty()) {
      Report(rules::kEmptyKey, PlaceOf(entry), key, "the key is empty");
    }
  }

  // Of two entries of a key the one in the later group is found, and within a group the earlier
  // one.
  void Define(const StoredGroup& group, const StoredEntry& entry, const std::string& key) {
    const Definition* const other = definitions.Find(key);
    const bool isShadowed = other != nullptr && definingGroups[key] == &group;
    const Place place = PlaceOf(entry);
    if (other != nullptr) {
      Report(rules::kShadowedEntry, isShadowed ? place : other->place, key,
             fmt::format("'{}' hides behind another entry of its key", Shown(key)))
          .notes.push_back(NoteOf(isShadowed ? other->place : place, "this one is found"));
    }
    if (isShadowed) return;
    definitions.Put({key, ValueOf(entry), place});
    definingGroups[key] = &group;
  }

  std::vector<uint16_t> ValueOf(const StoredEntry& entry) const {
    if (parsed.encoding == TextEncoding::kUTF16LE) return UnitsOf(entry.value);
    return FromMultiByte(AsText(entry.value), tovali_private::SelectorFor(parsed.encoding));
  }

  Place PlaceOf(const StoredEntry& entry) const {
    return {.file = file.name, .entry = number, .hasOffset = true, .offset = entry.offset};
  }

  static std::string Shown(const std::string& key) { return Excerpt(KeyText(key)); }

  Finding& Report(const Rule& rule, Place place, const std::string& key, std::string message) {
    return findings.emplace_back(Finding{.rule = &rule,
                                         .place = std::move(place),
                                         .message = std::move(message),
                                         .key = KeyText(key)});
  }

  const ImageFile& file;
  std::vector<Finding>& findings;
  const tovali_private::ParsedImage parsed;
  Definitions definitions;
  std::unordered_map<std::string, const StoredGroup*, platform::SeededHash> definingGroups;
  size_t number = 0;
};

}  // namespace

Definitions CheckImage(const ImageFile& file, std::vector<Finding>& findings) {
  return ImageCheck(file, findings).Run();
}
