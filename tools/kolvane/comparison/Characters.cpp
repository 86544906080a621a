#include "Characters.h"

#include <boost/spirit/home/support/char_encoding/unicode/query.hpp>

namespace ucd = boost::spirit::ucd;

namespace {

constexpr bool IsHighSurrogate(uint16_t unit) {
  return (unit & 0xFC00) == 0xD800;
}

constexpr bool IsLowSurrogate(uint16_t unit) {
  return (unit & 0xFC00) == 0xDC00;
}

constexpr char32_t Joined(uint16_t high, uint16_t low) {
  return 0x10000 + ((char32_t{high} & 0x3FF) << 10) + (char32_t{low} & 0x3FF);
}

}  // namespace

Character CharacterAt(std::span<const uint16_t> text, size_t at) {
  const uint16_t unit = text[at];
  if (!IsHighSurrogate(unit) && !IsLowSurrogate(unit)) return {unit, 1};
  const bool isPair = IsHighSurrogate(unit) && at + 1 < text.size() && IsLowSurrogate(text[at + 1]);
  return isPair ? Character{Joined(unit, text[at + 1]), 2} : Character{0xFFFD, 1};
}

bool IsLetter(char32_t code) {
  return ucd::is_alphabetic(code);
}

bool IsDigit(char32_t code) {
  return ucd::is_decimal_number(code);
}

bool IsControl(char32_t code) {
  return ucd::is_control(code);
}

bool IsQuoteOrBracket(char32_t code) {
  using enum ucd::properties::category;
  const auto category = ucd::get_category(code);
  return code == '"' || code == '\'' || category == open_punctuation ||
         category == close_punctuation || category == initial_punctuation ||
         category == final_punctuation;
}

bool IsWhiteSpace(char32_t code) {
  return ucd::is_white_space(code);
}

bool IsLineEnd(char32_t code) {
  return code == '\n' || code == '\r' || code == 0x2028 || code == 0x2029;
}

bool IsWrittenWithoutSpaces(char32_t code) {
  using enum ucd::properties::script;
  const bool isPunctuation =
      (code >= 0x3000 && code <= 0x303F) || (code >= 0xFF00 && code <= 0xFFEF);
  const auto script = ucd::get_script(code);
  return isPunctuation || script == han || script == hiragana || script == katakana ||
         script == bopomofo;
}

char32_t Folded(char32_t code) {
  return ucd::to_lowercase(code);
}
