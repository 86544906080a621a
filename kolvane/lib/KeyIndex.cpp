#include "kolvane/lib/KeyIndex.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <memory>
#include <new>
#include <utility>

#include "platform/Memory.h"
#include "platform/SeededHash.h"

namespace tovali_private {
namespace {

constexpr uint32_t kFirstSlots = 16;
constexpr uint32_t kMostSlots = 1u << 31;

constexpr uint32_t MostRuns(uint32_t slotCount) noexcept {
  return slotCount / 4 * 3;
}

// Prefetches the value's next cache lines, because a hit is copied next.
bool HasKey(const KeyedRun& run, std::span<const uint8_t> key) noexcept {
  const auto* const start = reinterpret_cast<const char*>(&run);
  __builtin_prefetch(start + 64);
  __builtin_prefetch(start + 128);
  const auto own = run.Key();
  return own.size() == key.size() &&
         (key.empty() || std::memcmp(own.data(), key.data(), key.size()) == 0);
}

}  // namespace

void KeyIndex::FreeSlots::operator()(Slot* memory) const noexcept {
  platform::FreeMemory(memory, size);
}

KeyIndex::Slots KeyIndex::MakeSlots(size_t count) {
  if (count > std::numeric_limits<size_t>::max() / sizeof(Slot)) throw std::bad_alloc();
  const size_t size = count * sizeof(Slot);
  Slots made(static_cast<Slot*>(platform::AllocateMemory(size)), FreeSlots{size});
  if (made == nullptr) throw std::bad_alloc();
  std::uninitialized_value_construct_n(made.get(), count);
  return made;
}

KeyIndex::KeyIndex()
    : seed(platform::ProcessSeed()),
      mask(kFirstSlots - 1),
      most(MostRuns(kFirstSlots)),
      slots(MakeSlots(kFirstSlots)) {}

void KeyIndex::Prepare(uint32_t hash) const noexcept {
  __builtin_prefetch(&slots[hash & mask]);
}

KeyedRun* KeyIndex::Find(std::span<const uint8_t> key) const noexcept {
  return slots[SlotFor(HashOf(key), key)].run;
}

KeyedRun* KeyIndex::Put(KeyedRun& run, uint32_t hash) noexcept {
  Slot& slot = slots[SlotFor(hash, run.Key())];
  if (slot.run == nullptr) ++runCount;
  slot.hash = hash;
  return std::exchange(slot.run, &run);
}

void KeyIndex::Replace(const KeyedRun& run, KeyedRun& other) noexcept {
  Slot& slot = slots[SlotFor(HashOf(run.Key()), run.Key())];
  if (slot.run == &run) slot.run = &other;
}

// Backward-shift deletion: fills the gap with later entries whose home slot is not after it. No
// tombstones are left, so probes stay short.
void KeyIndex::Remove(const KeyedRun& run) noexcept {
  uint32_t gap = SlotFor(HashOf(run.Key()), run.Key());
  for (uint32_t next = Behind(gap); slots[next].run != nullptr; next = Behind(next)) {
    const uint32_t fromHome = (next - slots[next].hash) & mask;
    const uint32_t fromGap = (next - gap) & mask;
    if (fromHome < fromGap) continue;
    slots[gap] = slots[next];
    gap = next;
  }
  slots[gap] = {};
  --runCount;
}

void KeyIndex::Clear() noexcept {
  std::fill_n(slots.get(), size_t{mask} + 1, Slot());
  runCount = 0;
}

uint32_t KeyIndex::HashOf(std::span<const uint8_t> key) const noexcept {
  const platform::SeededHash hash{seed};
  return static_cast<uint32_t>(hash({reinterpret_cast<const char*>(key.data()), key.size()}));
}

// Returns the key's slot, or the empty slot where the key would be inserted. Comparing the stored
// hash first avoids a cache miss for most other keys on the way.
uint32_t KeyIndex::SlotFor(uint32_t hash, std::span<const uint8_t> key) const noexcept {
  uint32_t at = hash & mask;
  while (slots[at].run != nullptr && !(slots[at].hash == hash && HasKey(*slots[at].run, key))) {
    at = Behind(at);
  }
  return at;
}

void KeyIndex::Grow() {
  if (mask + 1 == kMostSlots) throw std::bad_alloc();
  Slots old = MakeSlots((size_t{mask} + 1) * 2);
  old.swap(slots);
  const uint32_t oldMask = std::exchange(mask, mask * 2 + 1);
  most = MostRuns(mask + 1);
  for (uint32_t i = 0; i <= oldMask; ++i) {
    if (old[i].run == nullptr) continue;
    uint32_t at = old[i].hash & mask;
    while (slots[at].run != nullptr) at = Behind(at);
    slots[at] = old[i];
  }
}

}  // namespace tovali_private
