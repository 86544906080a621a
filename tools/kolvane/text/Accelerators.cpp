#include "tools/kolvane/text/Accelerators.h"

#include <algorithm>

#include "tools/kolvane/text/Characters.h"

namespace {

using Units = std::span<const uint16_t>;

constexpr size_t kLongestEntity = 33;  // no name in HTML has more than 31 letters

bool IsInEntity(uint16_t unit) {
  return (unit >= 'a' && unit <= 'z') || (unit >= 'A' && unit <= 'Z') ||
         (unit >= '0' && unit <= '9') || unit == '#';
}

// Whether a text that begins with `&` begins with an entity; one letter makes none, so that `&A;`
// is an accelerator.
bool BeginsWithEntity(Units text) {
  const Units start = text.first(std::min(text.size(), kLongestEntity)).subspan(1);
  const auto end = std::ranges::find_if_not(start, IsInEntity);
  return end != start.end() && *end == ';' && end - start.begin() > 1;
}

bool CanChoose(char32_t code) {
  if (code == '{') return true;
  return !IsWhiteSpace(code) && !IsControl(code) && !IsQuoteOrBracket(code);
}

bool BeginsWithAccelerator(Units text) {
  if (text.size() < 2) return false;
  return CanChoose(CharacterAt(text, 1).code) && !BeginsWithEntity(text);
}

}  // namespace

std::vector<size_t> FindAccelerators(Units text) {
  std::vector<size_t> found;
  for (size_t at = 0; at < text.size(); ++at) {
    if (text[at] != '&') continue;
    if (at + 1 < text.size() && text[at + 1] == '&') {
      ++at;
    } else if (BeginsWithAccelerator(text.subspan(at))) {
      found.push_back(at);
    }
  }
  return found;
}

std::optional<char32_t> AcceleratorOf(Units text) {
  const std::vector<size_t> found = FindAccelerators(text);
  if (found.size() != 1) return std::nullopt;
  const char32_t code = CharacterAt(text, found.front() + 1).code;
  if (code == '%' || code == '{') return std::nullopt;
  return Folded(code);
}
