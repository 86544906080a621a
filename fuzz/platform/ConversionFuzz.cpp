// Any bytes and any units, converted as ICU converts them. ICU tells the characters of ill-formed
// UTF-8, too, and which bytes between them belong together; it gets the text as it is.
#include <unicode/ucnv.h>
#include <unicode/unistr.h>
#include <unicode/utf8.h>

#include <algorithm>
#include <cstdint>
#include <memory>
#include <vector>

#include "fuzz/Input.h"
#include "platform/CodePage.h"

namespace {

using platform::kCodePageSystem;
using platform::kCodePageUTF8;

bool IsLead(uint8_t byte) {
  return byte >= 0xC2 && byte <= 0xF4;
}

// ICU replaces a lead byte and a second byte that it forbids (ED A0) one by one, the platform
// replaces both together: after a replaced lead byte alone, a byte of 80 to BF adds nothing.
std::u16string ICUDecodedUTF8(const std::string& text) {
  const auto* const bytes = reinterpret_cast<const uint8_t*>(text.data());
  const auto length = static_cast<int32_t>(text.size());
  icu::UnicodeString decoded;
  bool isAfterLead = false;
  for (int32_t at = 0; at < length;) {
    const int32_t start = at;
    UChar32 character = 0;
    U8_NEXT(bytes, at, length, character);
    const bool isOneByte = character < 0 && at - start == 1;
    const bool isForbidden = isAfterLead && isOneByte && U8_IS_TRAIL(bytes[start]);
    if (!isForbidden) decoded.append(character < 0 ? UChar32{0xFFFD} : character);
    isAfterLead = isOneByte && IsLead(bytes[start]);
  }
  return {decoded.getBuffer(), static_cast<size_t>(decoded.length())};
}

std::string ICUEncodedUTF8(const std::u16string& text) {
  std::string encoded;
  return icu::UnicodeString(text.data(), static_cast<int32_t>(text.size())).toUTF8String(encoded);
}

// Character by character, of which none that windows-1252 has is more than a byte or a unit.
class ICUWindows1252 {
 public:
  ICUWindows1252() {
    ucnv_setSubstChars(converter.get(), "?", 1, &error);
    ucnv_setFallback(converter.get(), false);
  }

  char16_t Decode(char byte) {
    char16_t unit = 0;
    ucnv_toUChars(converter.get(), &unit, 1, &byte, 1, &error);
    return unit;
  }

  char Encode(char16_t unit) {
    if (unit >= 0xD800 && unit < 0xE000) return '?';  // for half of a pair, too
    char byte = 0;
    const int32_t length = ucnv_fromUChars(converter.get(), &byte, 1, &unit, 1, &error);
    return length == 1 ? byte : '?';  // ICU leaves out what is invisible anyway
  }

 private:
  UErrorCode error = U_ZERO_ERROR;
  std::unique_ptr<UConverter, decltype(&ucnv_close)> converter{ucnv_open("windows-1252", &error),
                                                               &ucnv_close};
};

// A few buffers that are too small, each of its exact size.
template <class Unit, class Convert>
void RequireShortBuffersFail(int size, const Convert& convert) {
  for (const int capacity : {1, size / 2, size - 1}) {
    if (capacity < 1 || capacity >= size) continue;
    std::vector<Unit> units(static_cast<size_t>(capacity));
    Require(convert(units.data(), capacity) == 0, "a short buffer fails");
    Require(platform::GetLastError() == platform::kErrorInsufficientBuffer, "for its size");
  }
}

// Converts into a buffer of the exact size, and into one with room to spare.
template <class Unit, class Convert>
std::vector<Unit> Converted(const Convert& convert) {
  const int size = convert(nullptr, 0);
  Require(size > 0, "no text fails");
  RequireShortBuffersFail<Unit>(size, convert);
  std::vector<Unit> exact(static_cast<size_t>(size)), roomy(exact.size() + 9);
  Require(convert(exact.data(), size) == size, "the size is as it was counted");
  Require(convert(roomy.data(), size + 9) == size, "room to spare changes nothing");
  Require(std::equal(exact.begin(), exact.end(), roomy.begin()), "nor does it change the text");
  return exact;
}

std::u16string Decoded(uint32_t codePage, const std::string& text) {
  const std::vector<char> exact(text.begin(), text.end());
  const auto units = Converted<uint16_t>([&](uint16_t* out, int capacity) {
    const auto count = static_cast<int>(exact.size());
    return platform::MultiByteToWideChar(codePage, 0, exact.data(), count, out, capacity);
  });
  return {units.begin(), units.end()};
}

std::string Encoded(uint32_t codePage, const std::u16string& text) {
  const std::vector<uint16_t> exact(text.begin(), text.end());
  const auto bytes = Converted<char>([&](char* out, int capacity) {
    const auto count = static_cast<int>(exact.size());
    return platform::WideCharToMultiByte(codePage, 0, exact.data(), count, out, capacity);
  });
  return {bytes.begin(), bytes.end()};
}

void CheckBytes(const std::string& text, ICUWindows1252& icu) {
  Require(Decoded(kCodePageUTF8, text) == ICUDecodedUTF8(text), "ICU decodes UTF-8 so");
  std::u16string expected;
  for (const char byte : text) expected += icu.Decode(byte);
  Require(Decoded(kCodePageSystem, text) == expected, "ICU decodes windows-1252 so");
}

void CheckUnits(const std::u16string& text, ICUWindows1252& icu) {
  Require(Encoded(kCodePageUTF8, text) == ICUEncodedUTF8(text), "ICU encodes UTF-8 so");
  std::string expected;
  for (const char16_t unit : text) expected += icu.Encode(unit);
  Require(Encoded(kCodePageSystem, text) == expected, "ICU encodes windows-1252 so");
}

}  // namespace

// The bytes as they are, as units two by two, and as the UTF-16 that they are when they are UTF-8.
int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static ICUWindows1252 icu;
  if (size < 2) return 0;
  const std::string text(reinterpret_cast<const char*>(data), size);
  CheckBytes(text, icu);
  CheckUnits(UnitsFrom(text), icu);
  CheckUnits(ICUDecodedUTF8(text), icu);
  return 0;
}
