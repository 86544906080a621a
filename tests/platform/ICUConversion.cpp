#include "ICUConversion.h"

#include <unicode/unistr.h>

#include <algorithm>
#include <regex>

namespace {

// What counts as one here and as several with ICU: a lead byte with a second one that does not fit it,
// and a lead byte with all that is left where that is too little.
std::string WithMisfitsAsOne(const std::string& text) {
  static const std::regex misfits("\xE0[\x80-\x9F]|\xED[\xA0-\xBF]|\xF0[\x80-\x8F]|\xF4[\x90-\xBF]");
  std::string whole = text;
  for (size_t at = text.size() - std::min<size_t>(text.size(), 3); at < text.size(); ++at) {
    const auto byte = static_cast<unsigned char>(text[at]);
    const size_t length = byte < 0xC2 || byte > 0xF4 ? 1 : byte < 0xE0 ? 2 : byte < 0xF0 ? 3 : 4;
    if (text.size() - at >= length) continue;
    whole.resize(at);
    whole += '\xFF';
    break;
  }
  return std::regex_replace(whole, misfits, "\xFF");
}

}  // namespace

std::u16string ICUDecodedUTF8(const std::string& text) {
  const auto decoded = icu::UnicodeString::fromUTF8(WithMisfitsAsOne(text));
  return {decoded.getBuffer(), static_cast<size_t>(decoded.length())};
}

std::string ICUEncodedUTF8(const std::u16string& text) {
  std::string encoded;
  return icu::UnicodeString(text.data(), static_cast<int32_t>(text.size())).toUTF8String(encoded);
}

ICUWindows1252::ICUWindows1252() : converter(ucnv_open("windows-1252", &error), &ucnv_close) {
  ucnv_setSubstChars(converter.get(), "?", 1, &error);
  ucnv_setFallback(converter.get(), false);
}

char16_t ICUWindows1252::Decode(char byte) {
  char16_t unit = 0;
  ucnv_toUChars(converter.get(), &unit, 1, &byte, 1, &error);
  return unit;
}

char ICUWindows1252::Encode(char16_t unit) {
  if (unit >= 0xD800 && unit < 0xE000) return '?';
  char byte = 0;
  const int32_t length = ucnv_fromUChars(converter.get(), &byte, 1, &unit, 1, &error);
  return length == 1 ? byte : '?';  // ICU leaves out what is invisible anyway
}
