// Maps handles to items: slot index plus generation, so that stale handles are rejected.
#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <utility>
#include <vector>

namespace varnel_kernel {

enum class Kind : uint8_t { kNone, kObject, kMessageHandler, kData, kList, kDictionary, kPlugIn };
inline constexpr size_t kKindCount = 7;

// The base of everything that has a handle. Each derived class defines `kKind`, the kind of its
// handles, and `Handle`, their type (a 32-bit enumeration).
struct Item {
  Item() = default;
  Item(const Item&) = delete;
  Item& operator=(const Item&) = delete;
  virtual ~Item() = default;
};

// Owns its items. Any 32 bits may be passed as a handle; those of no item are rejected. A pointer
// to an item is valid until the item is removed. Only Add allocates; it takes constant time.
//
// A handle is a slot's index and the slot's generation (10 bits), which increases when its item is
// removed. A freed slot queues behind 1,024 others before it is reused, so a stale handle is
// rejected for at least a million further handles.
class HandleTable {
 public:
  // Adds an item with a reference count of 1. Throws: std::bad_alloc if memory or handles run out.
  template <class Kept>
  typename Kept::Handle Add(std::unique_ptr<Kept> item) {
    return typename Kept::Handle{AddItem(std::move(item), Kept::kKind)};
  }

  // Returns null if the handle is not that of an item of this class.
  template <class Kept>
  Kept* Find(typename Kept::Handle handle) const noexcept {
    const Slot* const slot = SlotOf(static_cast<uint32_t>(handle), Kept::kKind);
    return slot != nullptr ? static_cast<Kept*>(slot->item.get()) : nullptr;
  }

  // Increments the reference count. Returns false if the handle is not that of an item of this
  // class.
  template <class Kept>
  bool Retain(typename Kept::Handle handle) noexcept {
    Slot* const slot = SlotOf(static_cast<uint32_t>(handle), Kept::kKind);
    if (slot != nullptr) ++slot->count;
    return slot != nullptr;
  }

  // Decrements the reference count, unless it is 0, and returns it. Does not remove the item.
  // Requires: the handle is that of an item of this class.
  template <class Kept>
  uint64_t Release(typename Kept::Handle handle) noexcept {
    Slot* const slot = SlotOf(static_cast<uint32_t>(handle), Kept::kKind);
    return slot->count == 0 ? 0 : --slot->count;
  }

  // Invalidates the handle and returns its item, or null if the handle is not that of an item of
  // this class.
  template <class Kept>
  std::unique_ptr<Kept> Remove(typename Kept::Handle handle) noexcept {
    std::unique_ptr<Item> item = RemoveItem(static_cast<uint32_t>(handle), Kept::kKind);
    return std::unique_ptr<Kept>(static_cast<Kept*>(item.release()));
  }

  // Calls `visit(handle, item)` for each item of this class.
  template <class Kept, class Visit>
  void ForEach(Visit visit) const {
    for (uint32_t index = 1; index < slotCount; ++index) {
      const Slot& slot = SlotAt(index);
      if (slot.kind == Kept::kKind) {
        visit(typename Kept::Handle{HandleOf(index)}, static_cast<Kept&>(*slot.item));
      }
    }
  }

  uint32_t Live(Kind kind) const noexcept { return live[static_cast<size_t>(kind)]; }

  // Invalidates every handle and destroys every item.
  void Clear() noexcept;

 private:
  struct Slot {
    std::unique_ptr<Item> item;
    uint64_t count = 0;
    uint32_t generation = 0;
    uint32_t nextFree = 0;
    Kind kind = Kind::kNone;
  };

  static constexpr uint32_t kIndexBits = 22;
  static constexpr uint32_t kIndexMask = (1u << kIndexBits) - 1;
  static constexpr uint32_t kBlockSlots = 1024;

  uint32_t AddItem(std::unique_ptr<Item> item, Kind kind);
  std::unique_ptr<Item> RemoveItem(uint32_t handle, Kind kind) noexcept;

  Slot* SlotOf(uint32_t handle, Kind kind) noexcept {
    return const_cast<Slot*>(std::as_const(*this).SlotOf(handle, kind));
  }

  const Slot* SlotOf(uint32_t handle, Kind kind) const noexcept {
    const uint32_t index = handle & kIndexMask;
    if (index >= slotCount) return nullptr;
    const Slot& slot = SlotAt(index);
    return slot.kind == kind && slot.generation == handle >> kIndexBits ? &slot : nullptr;
  }

  Slot& SlotAt(uint32_t index) const noexcept {
    return blocks[index / kBlockSlots][index % kBlockSlots];
  }

  uint32_t HandleOf(uint32_t index) const noexcept;
  uint32_t TakeFreeSlot();

  std::vector<std::unique_ptr<Slot[]>> blocks;  // of kBlockSlots, so that growth moves no slot
  uint32_t slotCount = 0;                       // slot 0 stays empty: no handle is 0
  uint32_t firstFree = 0;
  uint32_t lastFree = 0;
  uint32_t freeCount = 0;
  std::array<uint32_t, kKindCount> live{};
};

}  // namespace varnel_kernel
