#include "tools/kolvane/lint/Comparison.h"

#include <fmt/format.h>
#include <fmt/ranges.h>

#include <algorithm>
#include <iterator>
#include <string_view>

#include "tools/kolvane/lint/PlaceholderComparison.h"
#include "tools/kolvane/lint/Rules.h"
#include "tools/kolvane/text/Accelerators.h"
#include "tools/kolvane/text/Characters.h"
#include "tools/kolvane/text/Placeholders.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

using Units = std::span<const uint16_t>;

std::string AcceleratorsIn(Units text, const std::vector<size_t>& places) {
  if (places.empty()) return "no accelerator";
  std::vector<std::string> written;
  written.reserve(places.size());
  for (const size_t at : places) {
    written.push_back(ToUTF8(text.subspan(at, 1 + CharacterAt(text, at + 1).length)));
  }
  return fmt::format("accelerator{} {}", written.size() == 1 ? "" : "s", fmt::join(written, ", "));
}

void CompareAccelerators(Units reference, Units translation, std::vector<Difference>& differences) {
  const std::vector<size_t> expected = FindAccelerators(reference);
  const std::vector<size_t> found = FindAccelerators(translation);
  const bool isMissing = found.empty() && !expected.empty();
  const bool isExtra = found.size() > expected.size();
  if (!isMissing && !isExtra) return;
  differences.push_back(
      {isMissing ? &rules::kAcceleratorMissing : &rules::kAcceleratorExtra,
       fmt::format("the translation has {}, the reference has {}",
                   AcceleratorsIn(translation, found), AcceleratorsIn(reference, expected))});
}

size_t CountLineBreaks(Units text) {
  size_t count = 0;
  uint16_t last = 0;
  for (const uint16_t unit : text) {
    if (IsLineEnd(unit) && !(last == '\r' && unit == '\n')) ++count;
    last = unit;
  }
  return count;
}

void CompareLineBreaks(Units reference, Units translation, std::vector<Difference>& differences) {
  const size_t expected = CountLineBreaks(reference);
  const size_t found = CountLineBreaks(translation);
  if (found == expected) return;
  differences.push_back(
      {&rules::kLineBreaks, fmt::format("the translation has {} line break{}, the reference has {}",
                                        found, found == 1 ? "" : "s", expected)});
}

char32_t LastCharacter(Units text) {
  const Character pair = CharacterAt(text, text.size() - std::min<size_t>(2, text.size()));
  return pair.length == 2 ? pair.code : CharacterAt(text, text.size() - 1).code;
}

bool IsEdgeSpace(char32_t code) {
  return IsWhiteSpace(code) && !IsLineEnd(code);
}

bool NeedsEdgeSpace(char32_t code) {
  return !IsWhiteSpace(code) && !IsWrittenWithoutSpaces(code);
}

void CompareEdges(char32_t reference, char32_t translation, std::string_view edge,
                  std::vector<Difference>& differences) {
  const bool isMissing = IsEdgeSpace(reference) && NeedsEdgeSpace(translation);
  const bool isExtra = IsEdgeSpace(translation) && NeedsEdgeSpace(reference);
  if (!isMissing && !isExtra) return;
  differences.push_back({&rules::kEdgeSpace, fmt::format("white space at the {} is {}", edge,
                                                         isMissing ? "missing from the translation"
                                                                   : "not in the reference")});
}

}  // namespace

std::vector<Difference> Compare(Units reference, Units translation) {
  if (reference.empty()) return {};
  if (translation.empty()) return {{&rules::kEmptyTranslation, "the translation is empty"}};

  const Placeholders expected = FindPlaceholders(reference);
  std::vector<Difference> differences =
      ComparePlaceholders(expected, FindPlaceholders(translation));
  CompareAccelerators(reference, translation, differences);
  CompareLineBreaks(reference, translation, differences);
  CompareEdges(CharacterAt(reference, 0).code, CharacterAt(translation, 0).code, "start",
               differences);
  CompareEdges(LastCharacter(reference), LastCharacter(translation), "end", differences);
  if (std::ranges::equal(reference, translation) && HasLetter(translation, expected)) {
    differences.push_back({&rules::kUntranslated, "the translation is the same as the reference"});
  }
  return differences;
}

bool HasLetter(Units text, const Placeholders& placeholders) {
  auto next = placeholders.all.begin();
  for (size_t at = 0; at < text.size();) {
    if (next != placeholders.all.end() && at == next->start) {
      at += next++->length;
      continue;
    }
    const Character character = CharacterAt(text, at);
    if (IsLetter(character.code)) return true;
    at += character.length;
  }
  return false;
}
