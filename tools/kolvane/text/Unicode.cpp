#include "tools/kolvane/text/Unicode.h"

#include <fmt/format.h>

#include <cstddef>

#include "kolvane/lib/Converters.h"
#include "kolvane/lib/LittleEndian.h"
#include "tools/kolvane/text/UTF8.h"

std::string ToMultiByte(std::span<const uint16_t> units, const int* selector) {
  const int size = tovali_private::CountMultiByte(units.data(), units.size(), selector);
  std::string text(static_cast<size_t>(size), '\0');
  tovali_private::ConvertToMultiByte(units.data(), units.size(), text.data(), size, selector);
  text.pop_back();
  return text;
}

std::vector<uint16_t> FromMultiByte(std::string_view text, const int* selector) {
  tovali_private::UnicodeBuffer units;
  tovali_private::ConvertToUnicode(text.data(), text.size(), units, selector);
  return {units.Data(), units.Data() + units.Length()};
}

std::string ToUTF8(std::span<const uint16_t> units) {
  return ToMultiByte(units, &kUTF8Selector);
}

std::vector<uint16_t> ToUTF16(std::string_view text) {
  return FromMultiByte(text, &kUTF8Selector);
}

std::string_view AsText(std::span<const uint8_t> bytes) noexcept {
  return {reinterpret_cast<const char*>(bytes.data()), bytes.size()};
}

std::vector<uint16_t> UnitsOf(std::span<const uint8_t> bytes) {
  std::vector<uint16_t> units(bytes.size() / 2);
  for (size_t i = 0; i < units.size(); ++i) units[i] = tovali_private::Read16(&bytes[2 * i]);
  return units;
}

std::vector<uint16_t> DecodedUTF16(std::string_view text, bool isBigEndian) {
  std::vector<uint16_t> units =
      UnitsOf({reinterpret_cast<const uint8_t*>(text.data()), text.size()});
  if (isBigEndian) {
    for (uint16_t& unit : units) unit = static_cast<uint16_t>(unit << 8 | unit >> 8);
  }
  return units;
}

std::string_view UTF16Mark(TextEncoding encoding) noexcept {
  if (encoding == TextEncoding::kUTF16LE) return "\xFF\xFE";
  if (encoding == TextEncoding::kUTF16BE) return "\xFE\xFF";
  return {};
}

std::string KeyText(std::string_view key) {
  if (IsValidUTF8(key)) return std::string(key);
  std::vector<uint16_t> units;
  for (const char byte : key) units.push_back(static_cast<unsigned char>(byte));
  return ToUTF8(units);
}

char32_t CodePointAt(std::span<const uint16_t> units, size_t at) noexcept {
  const char32_t first = units[at];
  if (first < 0xD800 || first > 0xDBFF || at + 1 == units.size()) return first;
  const char32_t second = units[at + 1];
  if (second < 0xDC00 || second > 0xDFFF) return first;
  return 0x10000 + ((first - 0xD800) << 10) + (second - 0xDC00);
}

bool IsSurrogate(char32_t codePoint) noexcept {
  return codePoint >= 0xD800 && codePoint < 0xE000;
}

size_t UnitCount(char32_t codePoint) noexcept {
  return codePoint > 0xFFFF ? 2 : 1;
}

bool IsLineEnd(char32_t codePoint) noexcept {
  return codePoint == '\n' || codePoint == '\r' || codePoint == 0x2028 || codePoint == 0x2029;
}

size_t CodePointCount(std::span<const uint16_t> units) noexcept {
  size_t count = 0;
  for (size_t at = 0; at < units.size(); ++count) at += UnitCount(CodePointAt(units, at));
  return count;
}

std::string CodePointText(char32_t codePoint) {
  return fmt::format("U+{:04X}", static_cast<uint32_t>(codePoint));
}
