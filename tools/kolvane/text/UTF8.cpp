#include "tools/kolvane/text/UTF8.h"

#include <algorithm>

namespace {

struct ByteRange {
  unsigned char first;
  unsigned char last;

  bool Contains(unsigned char byte) const noexcept { return first <= byte && byte <= last; }
};

// Leads with the second bytes that are neither overlong, nor half of a surrogate pair, nor beyond
// U+10FFFF, and the size of their characters.
struct Lead {
  ByteRange leads;
  ByteRange seconds;
  size_t size;
};

constexpr ByteRange kContinuations = {0x80, 0xBF};
constexpr Lead kLeads[] = {
    {{0xC2, 0xDF}, kContinuations, 2}, {{0xE0, 0xE0}, {0xA0, 0xBF}, 3},
    {{0xE1, 0xEC}, kContinuations, 3}, {{0xED, 0xED}, {0x80, 0x9F}, 3},
    {{0xEE, 0xEF}, kContinuations, 3}, {{0xF0, 0xF0}, {0x90, 0xBF}, 4},
    {{0xF1, 0xF3}, kContinuations, 4}, {{0xF4, 0xF4}, {0x80, 0x8F}, 4},
};

bool Continues(char byte) noexcept {
  return kContinuations.Contains(static_cast<unsigned char>(byte));
}

// The bytes of the character that a text begins with, or 0 where the first byte belongs to none.
size_t CharacterSize(std::string_view text) noexcept {
  const auto first = static_cast<unsigned char>(text.front());
  if (first < 0x80) return 1;
  const auto* const lead =
      std::ranges::find_if(kLeads, [&](const Lead& each) { return each.leads.Contains(first); });
  if (lead == std::end(kLeads) || text.size() < lead->size) return 0;
  const bool isWellFormed = lead->seconds.Contains(static_cast<unsigned char>(text[1])) &&
                            std::ranges::all_of(text.substr(2, lead->size - 2), Continues);
  return isWellFormed ? lead->size : 0;
}

// The bytes of the line end at an offset: CR LF is one, and so are U+2028 and U+2029. 0 at the end
// of the text and where no line ends.
size_t LineEndSize(std::string_view text, size_t at) noexcept {
  const std::string_view rest = text.substr(at);
  if (rest.starts_with("\r\n")) return 2;
  if (rest.starts_with('\n') || rest.starts_with('\r')) return 1;
  return rest.starts_with("\xE2\x80\xA8") || rest.starts_with("\xE2\x80\xA9") ? 3 : 0;
}

size_t LineEndAt(std::string_view text, size_t at) noexcept {
  constexpr std::string_view kFirstBytes = "\r\n\xE2";
  at = text.find_first_of(kFirstBytes, at);
  while (at < text.size() && LineEndSize(text, at) == 0) {
    at = text.find_first_of(kFirstBytes, at + 1);
  }
  return std::min(at, text.size());
}

size_t CharacterCount(std::string_view wellFormed) noexcept {
  return wellFormed.size() - static_cast<size_t>(std::ranges::count_if(wellFormed, Continues));
}

}  // namespace

std::string_view WithoutUTF8Mark(std::string_view text) noexcept {
  return text.substr(text.starts_with(kUTF8Mark) ? kUTF8Mark.size() : 0);
}

std::optional<size_t> MalformedUTF8At(std::string_view text) noexcept {
  for (size_t at = 0; at < text.size();) {
    const size_t size = CharacterSize(text.substr(at));
    if (size == 0) return at;
    at += size;
  }
  return std::nullopt;
}

bool IsValidUTF8(std::string_view text) noexcept {
  return !MalformedUTF8At(text);
}

bool IsMeantAsUTF8(std::string_view text) noexcept {
  if (text.starts_with(kUTF8Mark)) return true;
  size_t wellFormed = 0;
  size_t malformed = 0;
  for (size_t at = 0; at < text.size();) {
    const size_t size = CharacterSize(text.substr(at));
    wellFormed += size > 1 ? 1 : 0;
    malformed += size == 0 ? 1 : 0;
    at += std::max<size_t>(size, 1);
  }
  return wellFormed > malformed;
}

std::vector<MalformedByte> FindMalformedUTF8(std::string_view text, size_t most) {
  std::vector<MalformedByte> found;
  size_t number = 1;
  for (size_t at = text.size() - WithoutUTF8Mark(text).size(); found.size() < most; ++number) {
    const size_t end = LineEndAt(text, at);
    const std::string_view line = text.substr(at, end - at);
    if (const auto bad = MalformedUTF8At(line)) {
      found.push_back({at + *bad, number, 1 + CharacterCount(line.substr(0, *bad)), line});
    }
    if (end == text.size()) break;
    at = end + LineEndSize(text, end);
  }
  return found;
}
