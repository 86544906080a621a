// Words, as far as characters alone tell them.
#pragma once

#include <cstdint>
#include <span>

// What white space parts counts as one word where it has a letter or a digit, whatever else it has:
// `&Datei`, `{0}` and `don't` are one word each. Chinese and Japanese are written without spaces:
// there each character is a word, punctuation left out. So are Thai, Lao, Khmer and Burmese, but
// their words take a dictionary to tell: what spaces part counts as one.
uint64_t CountWords(std::span<const uint16_t> text);
