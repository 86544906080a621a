#include "kolvane/lib/TranslatedString.h"

#include <algorithm>

#include "kolvane/lib/OVErrException.h"

void TranslatedString::CopyTo(uint16_t* buffer, uint32_t capacity, bool throwIfShort) const {
  if (capacity != 0) {
    const uint32_t count = std::min(capacity, BufferSize()) - 1;
    std::copy_n(text.Data(), count, buffer);
    buffer[count] = 0;
  }
  if (throwIfShort && capacity < BufferSize()) throw OVErrException(kErrorBufferTooSmall);
}
