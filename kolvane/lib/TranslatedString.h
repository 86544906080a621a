// The result of a translation.
#pragma once

#include <cstdint>

#include "kolvane/lib/KolvaneString.h"

// Holds on to the translation, whose text it shares with the dictionary and which outlives it, with
// up to two megabytes of the dictionary's memory. Stays on the dictionary's thread.
class TranslatedString {
 public:
  explicit TranslatedString(const KolvaneString& translation) noexcept : text(translation) {}
  explicit TranslatedString(tovali_private::ByteRunValue& translation) noexcept
      : text(translation) {}

  // Code units, one more than the translation has: room for a terminator.
  uint32_t BufferSize() const noexcept { return text.Length() + 1; }

  // Stores as many of the translation's units as fit before a terminating 0 unit. With
  // throwIfShort, a capacity below BufferSize then throws kErrorBufferTooSmall; what was stored
  // stays. With a capacity of 0 nothing is stored, and the buffer may be null.
  void CopyTo(uint16_t* buffer, uint32_t capacity, bool throwIfShort) const;

 private:
  KolvaneString text;
};
