// The result of a load: format, counts, damage.
#pragma once

#include <cstdint>

// The maximum size of an image that a translator object takes, in bytes.
inline constexpr uint32_t kMostImageBytes = 0x7FFFFFFE;

enum class ImageFormat : uint8_t {
  kNone,  // nothing was loaded, or the image is too short
  kText,
  kBinary1_0,
  kBinary1_5,
  kBinaryOther  // an unknown version, of which nothing is loaded
};

// The encoding of a text image, or of the values of a binary image.
enum class TextEncoding : uint8_t { kCodePage, kUTF8, kUTF16LE, kUTF16BE };

// The kinds of damage.
enum class LoadDamage : uint8_t {
  kNone,
  kInterrupted,  // an exception, or a failure of the stream, ended the load
  kTooShort,     // too short for the test for the binary format; nothing is loaded

  // Of text images.
  kZeroCharacter,  // a zero at the start of a line ends the text before the image ends
  kHalfUnit,       // an odd last byte in UTF-16; read as if a 0 byte followed

  // Of binary images. These end the load:
  kShortRead,           // the image is shorter than its counts and lengths say
  kUnsupportedVersion,  // neither 1.0 nor 1.5
  kNoGroups,            // a count of 0 groups or records
  kBadCounts,           // 1.5: a group's cumulative count is odd, too high, or decreases
  // These do not:
  kBadBucket,    // a group's bucket index is out of range; its entries are dropped
  kWrongBucket,  // an entry's key belongs to another bucket; it is kept but never found
  kBadOffset     // 1.0: a group's entries do not end where its offsets say
};

struct LoadStatus {
  ImageFormat format = ImageFormat::kNone;
  TextEncoding encoding = TextEncoding::kCodePage;
  uint32_t entriesAdded = 0;     // by the load
  uint32_t entriesReplaced = 0;  // those of them whose key the table held already: in text the
                                 // older entry is gone, in a binary image it stays, hidden
  uint32_t linesDropped = 0;     // lines whose text begins with `$` or `$$` but not `$$$`
  LoadDamage damage = LoadDamage::kNone;  // what ended the load, or else the first of its groups,
                                          // or else of its keys

  // Where that was, in bytes from the image's start: the field that is wrong or cut short; for a
  // binary image that was interrupted, the entry, or the field that the stream failed to give. 0
  // where there is no such place.
  uint64_t damageOffset = 0;

  // Whether the image is what it claims to be. A dropped line is no damage, nor is what follows the
  // last group of a binary image.
  bool Complete() const noexcept { return damage == LoadDamage::kNone; }
};
