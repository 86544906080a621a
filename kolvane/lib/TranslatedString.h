// The result of a translation.
#pragma once

#include <cstdint>

#include "kolvane/lib/KolvaneString.h"

// Shares the text with the dictionary and outlives it, but keeps up to 2 MiB of the dictionary's
// memory allocated. Not synchronised with the dictionary.
class TranslatedString {
 public:
  explicit TranslatedString(const KolvaneString& translation) noexcept : text(translation) {}
  explicit TranslatedString(tovali_private::ByteRunValue& translation) noexcept
      : text(translation) {}

  // The length in code units plus 1 for a terminator.
  uint32_t BufferSize() const noexcept { return text.Length() + 1; }

  // Copies as many units as fit before a terminating 0 unit. A capacity of 0 copies nothing, and
  // the buffer may then be null. Throws: OVErrException with kErrorBufferTooSmall, after the copy,
  // if `throwIfShort` and `capacity` is less than BufferSize.
  void CopyTo(uint16_t* buffer, uint32_t capacity, bool throwIfShort) const;

 private:
  KolvaneString text;
};
