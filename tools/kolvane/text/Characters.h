// What the checks have to know of a character.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

struct Character {
  char32_t code;  // U+FFFD for a surrogate without its other half
  size_t length;  // in units
};

// The character at `at`, which is inside the text.
Character CharacterAt(std::span<const uint16_t> text, size_t at);

bool IsLetter(char32_t code);
bool IsDigit(char32_t code);
bool IsControl(char32_t code);

// A quotation mark or bracket of any script, opening or closing.
bool IsQuoteOrBracket(char32_t code);

// Line ends included, and spaces that do not break.
bool IsWhiteSpace(char32_t code);

// Chinese or Japanese, punctuation included: written without spaces around it.
bool IsWrittenWithoutSpaces(char32_t code);

// Its small letter, by the same rule for all languages.
char32_t Folded(char32_t code);
