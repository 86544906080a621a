// Dictionaries out: a table as an image in the Kolvane Binary Format (BinaryParser.h).
#pragma once

#include <cstddef>
#include <cstdint>
#include <iosfwd>
#include <vector>

#include "kolvane/lib/LoadStatus.h"

class DictionaryTable;

namespace tovali_private {

class DictionaryEntry;

// The order of two entries by their keys as bytes.
bool KeyComesBefore(const DictionaryEntry* one, const DictionaryEntry* other) noexcept;

// The entries that lookups find, by bucket and, within each, by their keys as bytes: an order that
// depends on nothing but the keys. They stay the table's. Throws std::bad_alloc.
std::vector<const DictionaryEntry*> FoundEntries(DictionaryTable& table);

enum class BinaryVersion : uint8_t { k1_0, k1_5 };

// A value that does not come back from its encoding as it is, from this unit on.
struct LostValue {
  const DictionaryEntry* entry;
  size_t unit;
};

// Writes what lookups find in the table: equal contents give equal bytes, and a table that loads
// the image gives the same answers. Values are encoded in UTF-16LE, UTF-8 or the code page.
//
// Returns the values that the encoding cannot carry; where there is one, nothing was written.
// Throws std::length_error for an image of more than 2^31 - 2 bytes, which no translator takes,
// OVErrException for a value that cannot be converted, and std::bad_alloc. Failures of the stream
// stay with the stream.
[[nodiscard]] std::vector<LostValue> WriteBinary(DictionaryTable& table, BinaryVersion version,
                                                 TextEncoding values, std::ostream& out);

}  // namespace tovali_private
