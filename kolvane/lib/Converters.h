// Conversion between UTF-16 and multibyte text, in the code page that a selector names
// (CodePageSelector.h).
//
// Lengths are in code units for UTF-16 and in bytes for multibyte text; no text needs a terminator.
// Damaged text is replaced, not refused (platform/CodePage.h says with what).
#pragma once

#include <cstddef>
#include <cstdint>

#include "kolvane/lib/CodePageSelector.h"
#include "kolvane/lib/GrowableBuffer.h"

namespace tovali_private {

// The selector that stands in for a missing one; itself missing, and so the default code page.
inline constexpr const int* kDefaultSelector = nullptr;

uint32_t CodePageFor(const int* selector) noexcept;

// The four converters. They never throw: each returns 0, or kErrorBufferTooSmall when the output is
// too small, or kErrorConversionFailed when the conversion fails for any other reason.

// Never reports a failure: a text that cannot be counted counts as 0 units.
uint32_t MultiByteToUnicodeLength(const char* text, int byteCount, int* unitCount,
                                  const int* selector) noexcept;

// A capacity of 0 counts and writes nothing, as it does on the platform.
uint32_t MultiByteToUnicode(const char* text, int byteCount, uint16_t* units, int unitCapacity,
                            const int* selector) noexcept;

// Counts one byte more than the text needs, for a terminator. Never reports a failure.
uint32_t UnicodeToMultiByteLength(const uint16_t* units, int unitCount, int* byteCount,
                                  const int* selector) noexcept;

// *bytesWritten is to be read only after a success. A capacity of 0 counts and writes nothing.
uint32_t UnicodeToMultiByte(const uint16_t* units, int unitCount, char* bytes, int byteCapacity,
                            int* bytesWritten, const int* selector) noexcept;

struct ConverterTable {
  decltype(&MultiByteToUnicodeLength) multiByteToUnicodeLength;
  decltype(&MultiByteToUnicode) multiByteToUnicode;
  decltype(&UnicodeToMultiByteLength) unicodeToMultiByteLength;
  decltype(&UnicodeToMultiByte) unicodeToMultiByte;
};

// Every conversion of the library calls through this table; ASCII that stands for itself in every
// code page may go without one.
extern ConverterTable gConverterTable;

// The guarded forms. They throw OVErrException with whatever non-zero code the converter returned,
// and with kErrorConversionFailed for a text longer than 2^31 - 1.

int CountUnicode(const char* text, size_t byteCount, const int* selector = kDefaultSelector);

// Replaces what `units` held; no terminator is stored. When it throws, the buffer's length is the
// counted one and its contents are undefined.
void ConvertToUnicode(const char* text, size_t byteCount, UnicodeBuffer& units,
                      const int* selector = kDefaultSelector);

// The bytes that ConvertToMultiByte needs, its terminator included.
int CountMultiByte(const uint16_t* units, size_t unitCount, const int* selector = kDefaultSelector);

// Stores the text and a terminating 0 byte in `size` bytes. A null buffer and one that is too small
// throw kErrorBufferTooSmall.
void ConvertToMultiByte(const uint16_t* units, size_t unitCount, char* bytes, int size,
                        const int* selector = kDefaultSelector);

}  // namespace tovali_private
