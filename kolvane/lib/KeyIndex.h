// Hash index from key to value; O(1) expected, for hostile keys too.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>

#include "kolvane/lib/DictionaryItems.h"

namespace tovali_private {

// Open addressing, linear probing, load factor 3/4, seeded per process. Holds at most one run for
// each key. Borrows its runs.
class KeyIndex {
 public:
  KeyIndex();
  KeyIndex(const KeyIndex&) = delete;
  KeyIndex& operator=(const KeyIndex&) = delete;

  // Makes room for one more key, which Put requires. Throws: std::bad_alloc, without effect.
  void ReserveOne() {
    if (runCount == most) Grow();
  }

  uint32_t HashOf(std::span<const uint8_t> key) const noexcept;

  // Prefetches the slot of a key with this hash.
  void Prepare(uint32_t hash) const noexcept;

  // Returns the run with this key, or null.
  KeyedRun* Find(std::span<const uint8_t> key) const noexcept;

  // Indexes the run by its key, whose hash is given. Returns the run that it replaces, or null.
  KeyedRun* Put(KeyedRun& run, uint32_t hash) noexcept;

  // If `run` is indexed, replaces it by `other`, which has the same key.
  void Replace(const KeyedRun& run, KeyedRun& other) noexcept;

  // Removes a run. Requires: the run is indexed.
  void Remove(const KeyedRun& run) noexcept;

  void Clear() noexcept;

 private:
  // Probes from hash & mask to the first empty slot.
  struct Slot {
    uint32_t hash = 0;
    KeyedRun* run = nullptr;
  };

  struct FreeSlots {
    void operator()(Slot* slots) const noexcept;
    size_t size;
  };
  using Slots = std::unique_ptr<Slot[], FreeSlots>;

  static Slots MakeSlots(size_t count);
  uint32_t SlotFor(uint32_t hash, std::span<const uint8_t> key) const noexcept;
  uint32_t Behind(uint32_t slot) const noexcept { return (slot + 1) & mask; }
  void Grow();

  uint64_t seed;
  uint32_t mask;  // number of slots - 1; the number is a power of two
  uint32_t most;  // number of runs at which the index grows
  uint32_t runCount = 0;
  Slots slots;
};

}  // namespace tovali_private
