// Memory for many small objects that are mostly made together and die together.
#pragma once

#include <boost/smart_ptr/local_shared_ptr.hpp>
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
  Arena();  // throws std::bad_alloc
  Arena(const Arena&) = delete;
  Arena& operator=(const Arena&) = delete;
  ~Arena() { Retire(); }

  // Lets go of its own chunk and takes over the other's, which hands out nothing afterwards.
  Arena& operator=(Arena&& other) noexcept;

  // Has the next chunk be large enough for this many bytes, as far as chunks become so large.
  void Expect(uint64_t byteCount) noexcept;

  // Aligned for pointers. Throws std::bad_alloc.
  void* Allocate(uint64_t size);

  // The size of the chunks that are not given back yet.
  uint64_t HeldBytes() const noexcept { return *heldBytes; }

  // Gives back what any arena has handed out.
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
