// Any bytes and any units, converted as ICU converts them.
#include <algorithm>
#include <vector>

#include "CodePage.h"
#include "ICUConversion.h"
#include "Input.h"

namespace {

using platform::kCodePageSystem;
using platform::kCodePageUTF8;

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
