// Writes a table as an image in the Kolvane Binary Format (BinaryParser.h).
#pragma once

#include <cstddef>
#include <cstdint>
#include <iosfwd>
#include <vector>

#include "kolvane/lib/LoadStatus.h"

class DictionaryTable;

namespace tovali_private {

class DictionaryEntry;

// Orders entries by the bytes of their keys.
bool KeyComesBefore(const DictionaryEntry* one, const DictionaryEntry* other) noexcept;

// Returns the entries that lookups find, ordered by bucket, then by the bytes of the key, so that
// the order depends on the keys only. The table keeps ownership. Throws: std::bad_alloc.
std::vector<const DictionaryEntry*> FoundEntries(DictionaryTable& table);

enum class BinaryVersion : uint8_t { k1_0, k1_5 };

// A value that the encoding cannot represent, from this unit on.
struct LostValue {
  const DictionaryEntry* entry;
  size_t unit;
};

// Writes the entries that lookups find, with values in UTF-16LE, UTF-8 or the code page. Equal
// contents give equal bytes, and a table that loads the image gives the same answers.
//
// Returns the values that the encoding cannot represent; if there are any, nothing was written. The
// stream keeps its own failures. Throws: std::length_error for an image of more than
// kMostImageBytes, OVErrException for a value that cannot be converted, std::bad_alloc.
[[nodiscard]] std::vector<LostValue> WriteBinary(DictionaryTable& table, BinaryVersion version,
                                                 TextEncoding values, std::ostream& out);

}  // namespace tovali_private
