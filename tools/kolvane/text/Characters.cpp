#include "tools/kolvane/text/Characters.h"

#include <boost/spirit/home/support/char_encoding/unicode/query.hpp>

#include "tools/kolvane/text/Unicode.h"

namespace ucd = boost::spirit::ucd;

Character CharacterAt(std::span<const uint16_t> text, size_t at) {
  const char32_t code = CodePointAt(text, at);
  return {IsSurrogate(code) ? U'\uFFFD' : code, UnitCount(code)};
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
