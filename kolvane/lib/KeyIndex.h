// Finds the entry for a key in constant time, whatever the keys look like.
#pragma once

#include <cstdint>
#include <memory>

#include "DictionaryItems.h"

namespace tovali_private {

// A hash table over whole keys, seeded anew in every process, so that an image can crowd its slots
// in a small share at most of the processes that load it. It owns none of its entries. Several of
// them may have equal keys: the one added last hides the others, and they come to light again,
// latest first, as those before them are removed.
//
// No operation allocates but Add, which grows the slots as entries come; where there is no memory
// for that the slots stay as they are and lookups slow down.
class KeyIndex {
 public:
  KeyIndex();
  KeyIndex(const KeyIndex&) = delete;
  KeyIndex& operator=(const KeyIndex&) = delete;

  // The entry added last of those that have this key, or null.
  DictionaryEntry* Find(const ByteRunKey& key) const noexcept;

  // Returns whether the entry hides another one of its key. The entry must not be in the index.
  bool Add(DictionaryEntry& entry) noexcept;

  // The entry must be in the index.
  void Remove(DictionaryEntry& entry) noexcept;

  // Forgets every entry, at the cost of a pass over the slots.
  void Clear() noexcept;

 private:
  uint32_t WholeHash(const ByteRunKey& key) const noexcept;
  DictionaryEntry*& SlotOf(uint32_t hash) const noexcept { return slots[hash & (slotCount - 1)]; }
  DictionaryEntry* Find(const ByteRunKey& key, uint32_t hash) const noexcept;
  void PutInFront(DictionaryEntry& entry) noexcept;
  void Grow() noexcept;

  uint64_t seed;
  uint32_t slotCount;  // a power of two
  uint32_t entryCount = 0;
  std::unique_ptr<DictionaryEntry*[]> slots;  // each the first of a list linked by nextInSlot
};

}  // namespace tovali_private
