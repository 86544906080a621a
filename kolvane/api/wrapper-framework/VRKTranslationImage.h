// Dictionary images as 16-bit units, the form in which they are sent to a translator object.
#pragma once

#include <cstdint>
#include <memory>

namespace Varnel {

// Units for SetTranslations. `units` is null for an empty image.
struct TranslationImage {
  std::unique_ptr<uint16_t[]> units;
  uint32_t unitCount = 0;
};

// Copies the bytes of a dictionary file, text or binary, into units. The translator receives
// exactly these bytes; after an odd count, one 0 byte follows. Translators take less than 2^31 - 1
// bytes. Throws: std::bad_alloc.
//
// The bytes overload of SetTranslations is for UTF-8 text only: a client sends its argument as
// UTF-8, which the kernel converts to UTF-16 with a byte-order mark. That would change any other
// image.
TranslationImage PackTranslationImage(const void* bytes, uint32_t byteCount);

}  // namespace Varnel
