// Memory for many small objects that are mostly made together and die together.
#pragma once

#include <cstddef>
#include <cstdint>

namespace tovali_private {

// Hands memory out of chunks, in the order in which it lies there. A chunk is given back when all
// that was handed out of it has been freed, which may be after the arena's own end; until then what
// was freed is not used again. Chunks grow with what the arena has handed out, to two megabytes.
//
// An arena and all that it hands out stay on one thread at a time.
class Arena {
 public:
  Arena() = default;
  Arena(const Arena&) = delete;
  Arena& operator=(const Arena&) = delete;
  ~Arena() { Retire(); }

  // Takes over the other's chunk.
  Arena& operator=(Arena&& other) noexcept;

  // Has the next chunk be large enough for this many bytes, as far as chunks become so large.
  void Expect(uint64_t byteCount) noexcept;

  // Aligned for pointers. Throws std::bad_alloc.
  void* Allocate(uint64_t size);

  // The bytes that it has handed out since it was made, whether they were freed or not.
  uint64_t HandedOut() const noexcept { return handedOut; }

  // Gives back what any arena has handed out.
  static void Free(void* memory) noexcept;

 private:
  struct Chunk;
  struct Header;

  static Chunk* CreateChunk(uint64_t size);
  static void* HandOut(Chunk& chunk, uint8_t* place) noexcept;
  void BeginChunk();
  void Retire() noexcept;

  Chunk* current = nullptr;
  uint8_t* next = nullptr;
  size_t left = 0;
  size_t nextChunkSize = size_t{1} << 12;
  uint64_t handedOut = 0;
};

}  // namespace tovali_private
