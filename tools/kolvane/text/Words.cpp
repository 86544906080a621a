#include "tools/kolvane/text/Words.h"

#include "tools/kolvane/text/Characters.h"

uint64_t CountWords(std::span<const uint16_t> text) {
  uint64_t words = 0;
  bool isInWord = false;
  for (size_t at = 0; at < text.size();) {
    const auto [code, length] = CharacterAt(text, at);
    at += length;
    if (IsWhiteSpace(code)) isInWord = false;
    if (!IsLetter(code) && !IsDigit(code)) continue;
    const bool standsAlone = IsWrittenWithoutSpaces(code);
    if (standsAlone || !isInWord) ++words;
    isInWord = !standsAlone;
  }
  return words;
}
