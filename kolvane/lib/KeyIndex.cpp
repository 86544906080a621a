#include "KeyIndex.h"

#define XXH_INLINE_ALL
#include <xxhash.h>

#include <algorithm>
#include <new>
#include <random>
#include <utility>

namespace tovali_private {
namespace {

constexpr uint32_t kFirstSlots = 16;
constexpr uint32_t kMostSlots = 1u << 31;

constexpr uint32_t MostItems(uint32_t slotCount) noexcept {
  return slotCount / 4 * 3;
}

uint64_t ProcessSeed() {
  static const uint64_t seed = [] {
    std::random_device random;
    return uint64_t{random()} << 32 | random();
  }();
  return seed;
}

}  // namespace

KeyIndex::KeyIndex()
    : seed(ProcessSeed()),
      mask(kFirstSlots - 1),
      most(MostItems(kFirstSlots)),
      slots(std::make_unique<Slot[]>(kFirstSlots)) {}

DictionaryEntry* KeyIndex::Find(const ByteRunKey& key) const noexcept {
  return slots[SlotFor(HashOf(key), key)].item;
}

DictionaryEntry* KeyIndex::Put(DictionaryEntry& item) noexcept {
  const uint32_t hash = HashOf(item);
  Slot& slot = slots[SlotFor(hash, item)];
  if (slot.item == nullptr) ++itemCount;
  slot.hash = hash;
  return std::exchange(slot.item, &item);
}

// Closes the gap: each item behind it, up to the next empty slot, moves into it unless it is to be
// looked for only from behind the gap on.
void KeyIndex::Remove(const DictionaryEntry& item) noexcept {
  uint32_t gap = SlotFor(HashOf(item), item);
  for (uint32_t next = Behind(gap); slots[next].item != nullptr; next = Behind(next)) {
    const uint32_t fromItsFirst = (next - slots[next].hash) & mask;
    const uint32_t fromGap = (next - gap) & mask;
    if (fromItsFirst < fromGap) continue;
    slots[gap] = slots[next];
    gap = next;
  }
  slots[gap] = {};
  --itemCount;
}

void KeyIndex::Clear() noexcept {
  std::fill_n(slots.get(), size_t{mask} + 1, Slot());
  itemCount = 0;
}

uint32_t KeyIndex::HashOf(const ByteRunKey& key) const noexcept {
  const auto bytes = key.Bytes();
  return static_cast<uint32_t>(XXH3_64bits_withSeed(bytes.data(), bytes.size(), seed));
}

// The slot of the item with this key, or else the empty one where it would go.
uint32_t KeyIndex::SlotFor(uint32_t hash, const ByteRunKey& key) const noexcept {
  uint32_t at = hash & mask;
  while (slots[at].item != nullptr && !(slots[at].hash == hash && slots[at].item->Equals(key))) {
    at = Behind(at);
  }
  return at;
}

void KeyIndex::Grow() {
  if (mask + 1 == kMostSlots) throw std::bad_alloc();
  auto old = std::make_unique<Slot[]>((size_t{mask} + 1) * 2);
  old.swap(slots);
  const uint32_t oldMask = std::exchange(mask, mask * 2 + 1);
  most = MostItems(mask + 1);
  for (uint32_t i = 0; i <= oldMask; ++i) {
    if (old[i].item == nullptr) continue;
    uint32_t at = old[i].hash & mask;
    while (slots[at].item != nullptr) at = Behind(at);
    slots[at] = old[i];
  }
}

}  // namespace tovali_private
