// A growable array that keeps its storage when it is cleared.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <memory>
#include <new>
#include <span>

namespace tovali_private {

// Capacity grows by half, the fraction dropped, as often as it takes, and never shrinks. A buffer
// holds at most 2^31 - 1 elements, so that a length always fits a converter's int; one that would
// have to hold more throws std::bad_alloc, as one whose storage cannot be allocated does, and is
// left as it was.
template <class Element>
class GrowableBuffer {
 public:
  explicit GrowableBuffer(uint32_t initialCapacity = 256)
      : capacity(std::max(initialCapacity, kLeastCapacity)),
        storage(std::make_unique_for_overwrite<Element[]>(capacity)) {}

  void Append(Element element) {
    if (length == capacity) Grow(size_t{length} + 1);
    storage[length++] = element;
  }

  // Appends uninitialised elements and returns them.
  std::span<Element> Extend(size_t count) {
    if (count > kMostElements - length) throw std::bad_alloc();  // before the sum wraps, on 32 bits
    Reserve(length + count);
    const std::span<Element> place(storage.get() + length, count);
    length += static_cast<uint32_t>(count);
    return place;
  }

  // Increases the capacity to at least `count`.
  void Reserve(size_t count) {
    if (count > capacity) Grow(count);
  }

  // New elements are uninitialised. Requires: `count` is at most the capacity.
  void SetLength(uint32_t count) noexcept { length = count; }

  void Clear() noexcept { length = 0; }

  Element* Data() noexcept { return storage.get(); }
  const Element* Data() const noexcept { return storage.get(); }
  uint32_t Length() const noexcept { return length; }
  uint32_t Capacity() const noexcept { return capacity; }

 private:
  static constexpr uint32_t kLeastCapacity = 2;  // what grows by half must hold two
  static constexpr size_t kMostElements = std::numeric_limits<int32_t>::max();

  void Grow(size_t needed) {
    if (needed > kMostElements) throw std::bad_alloc();
    uint64_t grown = capacity;
    while (grown < needed) grown += grown / 2;
    const auto newCapacity = static_cast<uint32_t>(std::min<uint64_t>(grown, kMostElements));
    auto newStorage = std::make_unique_for_overwrite<Element[]>(newCapacity);
    std::copy_n(storage.get(), length, newStorage.get());
    storage = std::move(newStorage);
    capacity = newCapacity;
  }

  uint32_t capacity;
  uint32_t length = 0;
  std::unique_ptr<Element[]> storage;
};

using UnicodeBuffer = GrowableBuffer<uint16_t>;
using ByteBuffer = GrowableBuffer<uint8_t>;

}  // namespace tovali_private
