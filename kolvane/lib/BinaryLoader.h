// Dictionaries in the Kolvane Binary Format, versions 1.0 and 1.5.
//
// All integers are little-endian, nothing is aligned or padded:
//
//   21 bytes magic, 1 major version, 1 minor version, 1 value encoding (0 UTF-16 in little-endian
//   order, 1 UTF-8, else the system's code page; a signed byte)
//   1.5: u32 group count G; G × u32 cumulative count of lengths, two for each entry; u32 lengths, a
//        key's and then its value's for each entry; G × u16 bucket index; keys and values
//   1.0: u16 record count, one more than there are groups; for each record a u16 bucket index and a
//        u32 offset of the group's first byte, or for the last record the end; for each entry a u32
//        length and the key, a u32 length and the value
#pragma once

#include <string_view>

#include "kolvane/lib/LoadStatus.h"

class DictionaryTable;

namespace tovali_private {

class InputStream;
struct StoredImage;

inline constexpr std::string_view kBinaryMagic = "Kolvane Binary Format";

// Whether a load takes the image for a binary one: it begins with the magic, or has it behind a
// byte-order mark of UTF-16. The latter is of no version that is known, for the header is looked
// for at the start all the same.
bool IsBinary(std::string_view image) noexcept;

// Takes the image apart, whose stream stands at offset 0 and which is known to be binary:
// `stored` gets its groups in their order, values as they are stored, and `status` format, encoding
// and damage, but none of keys. Returns whether the body was there to its end.
//
// Nothing that an image says is trusted: a count or a length that exceeds what is left of the
// stream is a short read, and is found out before anything is allocated for it. Throws
// std::bad_alloc.
bool ParseBinary(InputStream& image, StoredImage& stored, LoadStatus& status);

// The selector of the conversion (Converters.h) of values that are stored in `encoding`, which is
// not UTF-16.
const int* SelectorFor(TextEncoding encoding) noexcept;

// Loads such an image and splices each of its groups into the bucket that the group names, where it
// stays as it is until somebody looks into that bucket. Returns 0 when it read the body to its end
// and -1 when it stopped before; `status` gets format, encoding, counts and damage. What was read
// before a stop, or before a value whose conversion throws OVErrException, stays in the table.
int LoadBinary(DictionaryTable& table, InputStream& image, LoadStatus& status);

}  // namespace tovali_private
