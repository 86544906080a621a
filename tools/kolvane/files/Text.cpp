#include "Text.h"

#include <algorithm>
#include <cstddef>

#include "Converters.h"

namespace {

constexpr int kUTF8 = 1;

}  // namespace

std::string ToUTF8(std::span<const uint16_t> units) {
  using namespace tovali_private;
  const int size = CountMultiByte(units.data(), units.size(), &kUTF8);
  std::string text(static_cast<size_t>(size), '\0');
  ConvertToMultiByte(units.data(), units.size(), text.data(), size, &kUTF8);
  text.pop_back();
  return text;
}

std::vector<uint16_t> ToUTF16(std::string_view text) {
  tovali_private::UnicodeBuffer units;
  tovali_private::ConvertToUnicode(text.data(), text.size(), units, &kUTF8);
  return {units.Data(), units.Data() + units.Length()};
}

// Whatever is malformed becomes a replacement character beside those that the text holds itself.
bool IsValidUTF8(std::string_view text) {
  constexpr std::string_view kReplacement = "\xEF\xBF\xBD";
  std::ptrdiff_t own = 0;
  for (size_t at = text.find(kReplacement); at != text.npos; at = text.find(kReplacement, at + 3)) {
    ++own;
  }
  const std::vector<uint16_t> units = ToUTF16(text);
  return std::count(units.begin(), units.end(), uint16_t{0xFFFD}) == own;
}
