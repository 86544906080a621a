// How the loading of an image went. Loads never report by themselves; this is for those who ask.
#pragma once

#include <cstdint>

// The most bytes of an image, text or binary, that a translator takes.
inline constexpr uint32_t kMostImageBytes = 0x7FFFFFFE;

enum class ImageFormat : uint8_t {
  kNone,  // nothing was loaded, or the image is too short to tell
  kText,
  kBinary1_0,
  kBinary1_5,
  kBinaryOther  // a version that is not known; nothing of it is loaded
};

// What the text of an image is written in: the whole of a text image, the values of a binary one.
enum class TextEncoding : uint8_t { kCodePage, kUTF8, kUTF16LE, kUTF16BE };

// What is wrong with an image.
enum class LoadDamage : uint8_t {
  kNone,
  kInterrupted,  // an exception, or a failure of the stream, ended the load
  kTooShort,     // fewer bytes than the test for the binary format needs: nothing is loaded

  // Of text images.
  kZeroCharacter,  // a zero where a line begins ends the text, with more behind it
  kHalfUnit,       // a last byte lacks its other half; it was taken as followed by 0

  // Of binary images. These end the load:
  kShortRead,           // the image ends before what it announces
  kUnsupportedVersion,  // neither 1.0 nor 1.5
  kNoGroups,            // a count of 0 where at least one group or record is due
  kBadCounts,           // 1.5: a group's cumulative count is odd, too high, or decreases
  // These do not:
  kBadBucket,    // a group's bucket is beyond the table; its entries are dropped
  kWrongBucket,  // an entry's key belongs to another bucket; it is kept, and never found
  kBadOffset     // 1.0: a group's entries do not end where its offsets say
};

struct LoadStatus {
  ImageFormat format = ImageFormat::kNone;
  TextEncoding encoding = TextEncoding::kCodePage;
  uint32_t entriesAdded = 0;     // all that the load linked into the table
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
