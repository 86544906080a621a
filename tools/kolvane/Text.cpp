#include "Text.h"

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

// Whatever is malformed comes back as the replacement character.
bool IsValidUTF8(std::string_view text) {
  return ToUTF8(ToUTF16(text)) == text;
}
