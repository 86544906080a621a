// ICU's conversion, a second opinion on ours: what ICU does otherwise is made the same here.
#pragma once

#include <unicode/ucnv.h>

#include <memory>
#include <string>

std::u16string ICUDecodedUTF8(const std::string& text);
std::string ICUEncodedUTF8(const std::u16string& text);

// Character by character, of which none that windows-1252 has is more than a byte or a unit.
class ICUWindows1252 {
 public:
  ICUWindows1252();
  char16_t Decode(char byte);
  char Encode(char16_t unit);  // '?' for half of a pair, too

 private:
  UErrorCode error = U_ZERO_ERROR;
  std::unique_ptr<UConverter, decltype(&ucnv_close)> converter;
};
