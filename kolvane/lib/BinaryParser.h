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

#include <exception>
#include <string_view>

#include "kolvane/lib/LoadRecord.h"
#include "kolvane/lib/StoredGroups.h"

namespace tovali_private {

class InputStream;

inline constexpr std::string_view kBinaryMagic = "Kolvane Binary Format";

// Returns whether the image begins with the magic, optionally after a UTF-16 byte-order mark. A
// load takes both for binary images. The latter is of no known version, because the header is read
// from offset 0 all the same.
bool HasBinaryMagic(std::string_view image) noexcept;

// The contents of a binary image, up to where parsing stopped.
struct ParsedImage {
  StoredImage stored;  // the groups in their order; values as they are stored
  ImageFormat format = ImageFormat::kBinaryOther;
  TextEncoding encoding = TextEncoding::kCodePage;  // of the values
  Damage damage;  // the error that stopped parsing, else the first other one; keys are not checked
};

// Parses a binary image. Counts and lengths are checked against the rest of the stream before
// anything is allocated for them; one that is too large is a short read.
// Requires: the stream is at offset 0. Throws: std::bad_alloc.
ParsedImage ParseBinary(InputStream& image);

// Returns the selector (Converters.h) for values in an encoding other than UTF-16.
const int* SelectorFor(TextEncoding encoding) noexcept;

// An image's entries with their values in UTF-16.
struct ConvertedImage {
  StoredImage stored;          // all entries, or those before the failure
  Damage misfiled;             // the first key that belongs to another bucket
  std::exception_ptr failure;  // OVErrException or std::bad_alloc; null if there was none
  uint64_t failureOffset = 0;  // of the entry that was being converted
};

// Converts the values of an image from the encoding that `stored.valueSelector` names.
ConvertedImage ConvertValues(const StoredImage& stored) noexcept;

}  // namespace tovali_private
