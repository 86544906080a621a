// How the loading of an image went. Loads never report by themselves; this is for those who ask.
#pragma once

#include <cstdint>

enum class ImageFormat : uint8_t {
  kNone,  // nothing was loaded, or the image is too short to tell
  kText,
  kBinary1_0,
  kBinary1_5,
  kBinaryOther  // a version that is not known; nothing of it is loaded
};

// What the text of an image is written in: the whole of a text image, the values of a binary one.
enum class TextEncoding : uint8_t { kCodePage, kUTF8, kUTF16LE, kUTF16BE };

// What kept an image from being taken whole.
enum class LoadDamage : uint8_t {
  kNone,
  kInterrupted,         // an exception left the load
  kTooShort,            // fewer bytes than the test for the binary format needs
  kZeroCharacter,       // text: a zero where a line begins ends the input, with more behind it
  kShortRead,           // binary: the image ends before what it announces
  kUnsupportedVersion,  // binary: neither 1.0 nor 1.5
  kNoGroups,            // binary: a count of 0 where at least one group or record is due
  kBadCounts,  // binary 1.5: a group's cumulative count is odd, or less than the one before
  kBadBucket,  // binary: a bucket index beyond the table; that group's entries are dropped
  kBadOffset   // binary 1.0: a group's entries do not end where its offsets say
};

struct LoadStatus {
  ImageFormat format = ImageFormat::kNone;
  TextEncoding encoding = TextEncoding::kCodePage;
  uint32_t entriesAdded = 0;     // all that the load linked into the table
  uint32_t entriesReplaced = 0;  // those of them whose key the table held already: in text the
                                 // older entry is gone, in a binary image it stays, hidden
  uint32_t linesDropped = 0;     // lines whose text begins with `$` or `$$` but not `$$$`
  LoadDamage damage = LoadDamage::kNone;
  uint64_t damageOffset = 0;  // bytes from the image's start to where the damage was first met: the
                              // field that is wrong or cut short; 0 for kInterrupted

  // Whether every byte of the image was taken as what it claims to be; a dropped line is no damage.
  bool Complete() const noexcept { return damage == LoadDamage::kNone; }
};
