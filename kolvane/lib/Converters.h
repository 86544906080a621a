// Conversion between UTF-16 and multibyte text, in the code page that a selector names
// (CodePageSelector.h).
//
// Lengths are in code units for UTF-16 and in bytes for multibyte text. Input needs no terminator.
// Ill-formed text is replaced as platform/CodePage.h says.
#pragma once

#include <cstddef>
#include <cstdint>

#include "kolvane/lib/CodePageSelector.h"
#include "kolvane/lib/GrowableBuffer.h"

namespace tovali_private {

// Used if no selector is given. It is null, which selects the default code page.
inline constexpr const int* kDefaultSelector = nullptr;

uint32_t CodePageFor(const int* selector) noexcept;

// The four converters. Each returns 0, kErrorBufferTooSmall if the output is too small, or
// kErrorConversionFailed for any other failure.

// Never fails: a text that cannot be counted has 0 units.
uint32_t MultiByteToUnicodeLength(const char* text, int byteCount, int* unitCount,
                                  const int* selector) noexcept;

// A capacity of 0 writes nothing.
uint32_t MultiByteToUnicode(const char* text, int byteCount, uint16_t* units, int unitCapacity,
                            const int* selector) noexcept;

// Stores the number of bytes plus 1 for a terminator. Never fails.
uint32_t UnicodeToMultiByteLength(const uint16_t* units, int unitCount, int* byteCount,
                                  const int* selector) noexcept;

// *bytesWritten is valid only after success. A capacity of 0 writes nothing.
uint32_t UnicodeToMultiByte(const uint16_t* units, int unitCount, char* bytes, int byteCapacity,
                            int* bytesWritten, const int* selector) noexcept;

struct ConverterTable {
  decltype(&MultiByteToUnicodeLength) multiByteToUnicodeLength;
  decltype(&MultiByteToUnicode) multiByteToUnicode;
  decltype(&UnicodeToMultiByteLength) unicodeToMultiByteLength;
  decltype(&UnicodeToMultiByte) unicodeToMultiByte;
};

// Every conversion of the library calls through this table, except that of ASCII text, which is the
// same in every code page.
extern ConverterTable gConverterTable;

// The guarded forms. Throws: OVErrException with the converter's code if it is not 0, and with
// kErrorConversionFailed for a text longer than 2^31 - 1.

int CountUnicode(const char* text, size_t byteCount, const int* selector = kDefaultSelector);

// Replaces the contents of `units`, without terminator. If it throws, the buffer has the counted
// length and undefined contents.
void ConvertToUnicode(const char* text, size_t byteCount, UnicodeBuffer& units,
                      const int* selector = kDefaultSelector);

// Returns the number of bytes that ConvertToMultiByte needs, including the terminator.
int CountMultiByte(const uint16_t* units, size_t unitCount, const int* selector = kDefaultSelector);

// Stores the text and a terminating 0 byte in `size` bytes. Throws: OVErrException with
// kErrorBufferTooSmall if the buffer is null or too small.
void ConvertToMultiByte(const uint16_t* units, size_t unitCount, char* bytes, int size,
                        const int* selector = kDefaultSelector);

}  // namespace tovali_private
