// Bump allocation for many small objects that are created and freed together.
#pragma once

#include <boost/smart_ptr/local_shared_ptr.hpp>
#include <cstddef>
#include <cstdint>

namespace tovali_private {

// Bump allocator over refcounted chunks: a chunk is freed with its last block, even after the
// arena. Freed blocks are not reused. Chunks grow with the bytes allocated, up to 2 MiB. Not
// synchronised.
class Arena {
 public:
  Arena();  // Throws: std::bad_alloc
  Arena(const Arena&) = delete;
  Arena& operator=(const Arena&) = delete;
  ~Arena() { Retire(); }

  // `other` must not allocate again.
  Arena& operator=(Arena&& other) noexcept;

  // Size hint for the next chunk, capped at the maximum chunk size.
  void Expect(uint64_t byteCount) noexcept;

  // Aligned for pointers. Throws: std::bad_alloc.
  void* Allocate(uint64_t size);

  // The size of all chunks that are not freed.
  uint64_t HeldBytes() const noexcept { return *heldBytes; }

  // Frees a block of any arena.
  static void Free(void* memory) noexcept;

 private:
  struct Chunk;
  struct Header;

  Chunk* CreateChunk(uint64_t size) const;
  static void* HandOut(Chunk& chunk, uint8_t* place) noexcept;
  void BeginChunk();
  void Retire() noexcept;

  Chunk* current = nullptr;
  uint8_t* next = nullptr;
  size_t left = 0;
  size_t nextChunkSize = size_t{1} << 12;
  boost::local_shared_ptr<uint64_t> heldBytes;  // shared with the chunks
};

}  // namespace tovali_private
