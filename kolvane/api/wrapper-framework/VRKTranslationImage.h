// Dictionary files on their way to a translator object.
#pragma once

#include <cstdint>
#include <memory>

namespace Varnel {

// An image as units for SetTranslations: `units` is null and `unitCount` is 0 for an empty one.
struct TranslationImage {
  std::unique_ptr<uint16_t[]> units;
  uint32_t unitCount = 0;
};

// Copies the bytes of any dictionary file, text or binary, into units, so that the translator reads
// exactly those bytes; where their number is odd, one 0 byte follows. An image of 2^31 - 1
// bytes or more is more than a translator takes. Throws std::bad_alloc.
//
// The bytes form of SetTranslations is no way for a file as it is: a client sends what it is given
// as UTF-8, and the kernel recodes it to UTF-16 with a byte-order mark. That does for text in
// UTF-8, and only for that. Text of any other encoding would become other text, and a binary image
// no image at all.
TranslationImage PackTranslationImage(const void* bytes, uint32_t byteCount);

}  // namespace Varnel
