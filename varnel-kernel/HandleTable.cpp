#include "varnel-kernel/HandleTable.h"

#include <new>
#include <utility>

namespace varnel_kernel {
namespace {

constexpr uint32_t kRestingSlots = 1024;

}  // namespace

uint32_t HandleTable::AddItem(std::unique_ptr<Item> item, Kind kind) {
  const uint32_t index = TakeFreeSlot();
  Slot& slot = SlotAt(index);
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
  (freeCount == 0 ? firstFree : SlotAt(lastFree).nextFree) = index;
  lastFree = index;
  ++freeCount;
  return std::move(slot->item);
}

void HandleTable::Clear() noexcept {
  for (uint32_t index = 1; index < slotCount; ++index) {
    const Kind kind = SlotAt(index).kind;
    if (kind != Kind::kNone) RemoveItem(HandleOf(index), kind);
  }
}

uint32_t HandleTable::HandleOf(uint32_t index) const noexcept {
  return SlotAt(index).generation << kIndexBits | index;
}

uint32_t HandleTable::TakeFreeSlot() {
  if (freeCount > kRestingSlots) {
    const uint32_t index = firstFree;
    firstFree = SlotAt(index).nextFree;
    --freeCount;
    return index;
  }
  if (slotCount > kIndexMask) throw std::bad_alloc();
  if (slotCount % kBlockSlots == 0) blocks.push_back(std::make_unique<Slot[]>(kBlockSlots));
  if (slotCount == 0) ++slotCount;
  return slotCount++;
}

}  // namespace varnel_kernel
