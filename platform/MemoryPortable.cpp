#include <sys/mman.h>

#include <cstdint>
#include <new>

#include "platform/Memory.h"

namespace platform {
namespace {

constexpr size_t WholePages(size_t size) noexcept {
  return (size + kHugePage - 1) / kHugePage * kHugePage;
}

// Whether at least eight ninths of the huge pages would be used.
constexpr bool FillsHugePages(size_t size) noexcept {
  return size <= SIZE_MAX - 2 * kHugePage && WholePages(size) - size <= size / 8;
}

// Huge pages are aligned to their size: maps one more and unmaps the ends.
void* MapHugePages(size_t size) noexcept {
  void* const mapped =
      mmap(nullptr, size + kHugePage, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  if (mapped == MAP_FAILED) return nullptr;
  auto* const start = static_cast<char*>(mapped);
  const size_t before = -reinterpret_cast<uintptr_t>(start) % kHugePage;
  if (before != 0) munmap(start, before);
  munmap(start + before + size, kHugePage - before);
#ifdef MADV_HUGEPAGE
  madvise(start + before, size, MADV_HUGEPAGE);
#endif
  return start + before;
}

}  // namespace

void* AllocateMemory(size_t size) noexcept {
  return FillsHugePages(size) ? MapHugePages(WholePages(size)) : ::operator new(size, std::nothrow);
}

void FreeMemory(void* memory, size_t size) noexcept {
  if (!FillsHugePages(size)) {
    ::operator delete(memory);
  } else if (memory != nullptr) {
    munmap(memory, WholePages(size));
  }
}

}  // namespace platform
