#include "kolvane/lib/Arena.h"

#include <algorithm>
#include <boost/smart_ptr/make_local_shared.hpp>
#include <limits>
#include <new>
#include <utility>

#include "platform/Memory.h"

namespace tovali_private {

struct Arena::Chunk {
  void Release() noexcept {
    if (--holders != 0) return;
    const size_t bytes = size;
    *heldBytes -= bytes;
    this->~Chunk();
    platform::FreeMemory(this, bytes);
  }

  boost::local_shared_ptr<uint64_t> heldBytes;
  size_t size;
  size_t holders;  // reference count: live blocks, and the arena while this is its current chunk
};

// Precedes each block.
struct Arena::Header {
  Chunk* chunk;
};

Arena::Arena() : heldBytes(boost::make_local_shared<uint64_t>()) {}

Arena::Chunk* Arena::CreateChunk(uint64_t size) const {
  if (size > std::numeric_limits<size_t>::max()) throw std::bad_alloc();
  void* const memory = platform::AllocateMemory(static_cast<size_t>(size));
  if (memory == nullptr) throw std::bad_alloc();
  *heldBytes += size;
  return ::new (memory) Chunk{heldBytes, static_cast<size_t>(size), 0};
}

void* Arena::HandOut(Chunk& chunk, uint8_t* place) noexcept {
  ++chunk.holders;
  return ::new (place) Header{&chunk} + 1;
}

Arena& Arena::operator=(Arena&& other) noexcept {
  Retire();
  current = std::exchange(other.current, nullptr);
  next = other.next;
  left = std::exchange(other.left, 0);
  nextChunkSize = other.nextChunkSize;
  heldBytes = other.heldBytes;
  return *this;
}

void Arena::Expect(uint64_t byteCount) noexcept {
  constexpr size_t kMost = platform::kHugePage;
  const size_t expected = byteCount < kMost / 2 ? static_cast<size_t>(byteCount) : kMost;
  nextChunkSize = std::max(nextChunkSize, expected);
}

void* Arena::Allocate(uint64_t size) {
  constexpr uint64_t kAlignment = alignof(Header);
  const uint64_t needed = sizeof(Header) + (size + kAlignment - 1) / kAlignment * kAlignment;
  if (needed > left) {
    const bool isLarge = needed > nextChunkSize / 4;
    if (isLarge) {
      Chunk* const own = CreateChunk(sizeof(Chunk) + needed);
      return HandOut(*own, reinterpret_cast<uint8_t*>(own + 1));
    }
    BeginChunk();
  }
  left -= static_cast<size_t>(needed);
  return HandOut(*current, std::exchange(next, next + needed));
}

void Arena::BeginChunk() {
  Chunk* const fresh = CreateChunk(nextChunkSize);
  Retire();
  current = fresh;
  current->holders = 1;
  next = reinterpret_cast<uint8_t*>(current + 1);
  left = nextChunkSize - sizeof(Chunk);
  nextChunkSize = std::min(nextChunkSize * 2, platform::kHugePage);
}

void Arena::Free(void* memory) noexcept {
  (static_cast<Header*>(memory) - 1)->chunk->Release();
}

void Arena::Retire() noexcept {
  if (current != nullptr) current->Release();
}

}  // namespace tovali_private
