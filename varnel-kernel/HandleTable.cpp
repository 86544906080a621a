#include "HandleTable.h"

#include <new>
#include <utility>

namespace varnel_kernel {
namespace {

constexpr uint32_t kRestingSlots = 1024;

}  // namespace

uint32_t HandleTable::AddItem(std::unique_ptr<Item> item, Kind kind) {
  const uint32_t index = TakeFreeSlot();
  Slot& slot = slots[index];
  slot.item = std::move(item);
  slot.count = 1;
  slot.kind = kind;
  ++live[static_cast<size_t>(kind)];
  return HandleOf(index);
}

std::unique_ptr<Item> HandleTable::RemoveItem(uint32_t handle, Kind kind) noexcept {
  Slot* const slot = SlotOf(handle, kind);
  if (slot == nullptr) return nullptr;
  const uint32_t index = handle & kIndexMask;
  --live[static_cast<size_t>(kind)];
  slot->kind = Kind::kNone;
  constexpr uint32_t kGenerationMask = (1u << (32 - kIndexBits)) - 1;
  slot->generation = (slot->generation + 1) & kGenerationMask;
  slot->nextFree = 0;
  (freeCount == 0 ? firstFree : slots[lastFree].nextFree) = index;
  lastFree = index;
  ++freeCount;
  return std::move(slot->item);
}

void HandleTable::Clear() noexcept {
  for (uint32_t index = 1; index < slots.size(); ++index) {
    const Kind kind = slots[index].kind;
    if (kind != Kind::kNone) RemoveItem(HandleOf(index), kind);
  }
}

uint32_t HandleTable::HandleOf(uint32_t index) const noexcept {
  return slots[index].generation << kIndexBits | index;
}

uint32_t HandleTable::TakeFreeSlot() {
  if (freeCount > kRestingSlots) {
    const uint32_t index = firstFree;
    firstFree = slots[index].nextFree;
    --freeCount;
    return index;
  }
  if (slots.size() > kIndexMask) throw std::bad_alloc();
  slots.emplace_back();
  return static_cast<uint32_t>(slots.size() - 1);
}

}  // namespace varnel_kernel
