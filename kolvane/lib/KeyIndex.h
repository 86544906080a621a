// Finds an item by its key in constant time, whatever the keys look like.
#pragma once

#include <cstdint>
#include <memory>

#include "DictionaryItems.h"

namespace tovali_private {

// A hash table over whole keys that knows at most one item for each. It is seeded anew in every
// process, so that no image can be made to crowd its slots. It owns no items, and moves none.
class KeyIndex {
 public:
  KeyIndex();
  KeyIndex(const KeyIndex&) = delete;
  KeyIndex& operator=(const KeyIndex&) = delete;

  // Makes room for another key; Put needs it. Throws std::bad_alloc, and has then done nothing.
  void ReserveOne() {
    if (itemCount == most) Grow();
  }

  // The item with this key, or null.
  DictionaryEntry* Find(const ByteRunKey& key) const noexcept;

  // Makes the item the one that is found by its key. Returns the one that was, or null.
  DictionaryEntry* Put(DictionaryEntry& item) noexcept;

  // Forgets an item that Find finds.
  void Remove(const DictionaryEntry& item) noexcept;

  void Clear() noexcept;

 private:
  // Slots are looked through from the one that the hash names onwards, up to an empty one.
  struct Slot {
    uint32_t hash = 0;
    DictionaryEntry* item = nullptr;
  };

  uint32_t Behind(uint32_t slot) const noexcept { return (slot + 1) & mask; }
  uint32_t HashOf(const ByteRunKey& key) const noexcept;
  uint32_t SlotFor(uint32_t hash, const ByteRunKey& key) const noexcept;
  void Grow();

  uint64_t seed;
  uint32_t mask;  // one less than the number of slots, which is a power of two
  uint32_t most;  // items, for lookups to stay short
  uint32_t itemCount = 0;
  std::unique_ptr<Slot[]> slots;
};

}  // namespace tovali_private
