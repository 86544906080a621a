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
      slotCount(kFirstSlots),
      slots(std::make_unique<DictionaryEntry*[]>(kFirstSlots)) {}

DictionaryEntry* KeyIndex::Find(const ByteRunKey& key) const noexcept {
  return Find(key, WholeHash(key));
}

bool KeyIndex::Add(DictionaryEntry& entry) noexcept {
  if (entryCount >= slotCount) Grow();
  entry.wholeHash = WholeHash(entry);
  const bool hides = Find(entry, entry.wholeHash) != nullptr;
  PutInFront(entry);
  ++entryCount;
  return hides;
}

void KeyIndex::Remove(DictionaryEntry& entry) noexcept {
  DictionaryEntry** link = &SlotOf(entry.wholeHash);
  while (*link != &entry) link = &(*link)->nextInSlot;
  *link = std::exchange(entry.nextInSlot, nullptr);
  --entryCount;
}

void KeyIndex::Clear() noexcept {
  std::fill_n(slots.get(), slotCount, nullptr);
  entryCount = 0;
}

uint32_t KeyIndex::WholeHash(const ByteRunKey& key) const noexcept {
  const auto bytes = key.Bytes();
  return static_cast<uint32_t>(XXH3_64bits_withSeed(bytes.data(), bytes.size(), seed));
}

DictionaryEntry* KeyIndex::Find(const ByteRunKey& key, uint32_t hash) const noexcept {
  DictionaryEntry* entry = SlotOf(hash);
  while (entry != nullptr && !(entry->wholeHash == hash && entry->Equals(key))) {
    entry = entry->nextInSlot;
  }
  return entry;
}

void KeyIndex::PutInFront(DictionaryEntry& entry) noexcept {
  DictionaryEntry*& slot = SlotOf(entry.wholeHash);
  entry.nextInSlot = std::exchange(slot, &entry);
}

// Entries with equal keys move from one slot to another together and must keep their order, so each
// list is turned round before its entries are put, one in front of the other, into their new slots.
void KeyIndex::Grow() noexcept {
  if (slotCount == kMostSlots) return;
  std::unique_ptr<DictionaryEntry*[]> old(new (std::nothrow)
                                              DictionaryEntry*[size_t{slotCount} * 2]());
  if (old == nullptr) return;
  old.swap(slots);
  const uint32_t oldCount = std::exchange(slotCount, slotCount * 2);
  for (uint32_t i = 0; i < oldCount; ++i) {
    DictionaryEntry* reversed = nullptr;
    while (DictionaryEntry* entry = old[i]) {
      old[i] = std::exchange(entry->nextInSlot, reversed);
      reversed = entry;
    }
    while (DictionaryEntry* entry = reversed) {
      reversed = entry->nextInSlot;
      PutInFront(*entry);
    }
  }
}

}  // namespace tovali_private
