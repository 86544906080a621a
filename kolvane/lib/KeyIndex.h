// Finds what has a key in constant time, whatever the keys look like.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>

#include "kolvane/lib/DictionaryItems.h"

namespace tovali_private {

// A hash table over whole keys that knows at most one run for each. Its hash is seeded anew in
// every process, so that no image can be made to crowd its slots. It owns no runs.
class KeyIndex {
 public:
  KeyIndex();
  KeyIndex(const KeyIndex&) = delete;
  KeyIndex& operator=(const KeyIndex&) = delete;

  // Makes room for one more key; Put needs it. Throws std::bad_alloc, and has then done nothing.
  void ReserveOne() {
    if (runCount == most) Grow();
  }

  // Has what the key's operations need fetched meanwhile.
  void Prepare(std::span<const uint8_t> key) const noexcept;

  // The run with this key, or null.
  KeyedRun* Find(std::span<const uint8_t> key) const noexcept;

  // Makes the run the one that is found by its key. Returns the one that was, or null.
  KeyedRun* Put(KeyedRun& run) noexcept;

  // Has a run found no longer, if it was, but another one of its key.
  void Replace(const KeyedRun& run, KeyedRun& other) noexcept;

  // Forgets a run that Find finds.
  void Remove(const KeyedRun& run) noexcept;

  void Clear() noexcept;

 private:
  // Slots are looked through from the one that the hash names onwards, up to an empty one.
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
  uint32_t HashOf(std::span<const uint8_t> key) const noexcept;
  uint32_t SlotFor(uint32_t hash, std::span<const uint8_t> key) const noexcept;
  uint32_t Behind(uint32_t slot) const noexcept { return (slot + 1) & mask; }
  void Grow();

  uint64_t seed;
  uint32_t mask;  // one less than the number of slots, which is a power of two
  uint32_t most;  // runs, for lookups to stay short
  uint32_t runCount = 0;
  Slots slots;
};

}  // namespace tovali_private
