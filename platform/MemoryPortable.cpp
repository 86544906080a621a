#include <sys/mman.h>

#include <cstdint>
#include <new>

#include "Memory.h"

namespace platform {
namespace {

size_t WholePages(size_t size) noexcept {
  return (size + kLargeMemory - 1) / kLargeMemory * kLargeMemory;
}

// Huge pages are as large as kLargeMemory, and begin at its multiples.
void* MapHugePages(size_t size) noexcept {
  const size_t reserved = size + kLargeMemory;
  void* const mapped =
      mmap(nullptr, reserved, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  if (mapped == MAP_FAILED) return nullptr;
  auto* const start = static_cast<char*>(mapped);
  const size_t before = -reinterpret_cast<uintptr_t>(start) % kLargeMemory;
  if (before != 0) munmap(start, before);
  munmap(start + before + size, kLargeMemory - before);
#ifdef MADV_HUGEPAGE
  madvise(start + before, size, MADV_HUGEPAGE);
#endif
  return start + before;
}

}  // namespace

void* AllocateMemory(size_t size) noexcept {
  if (size < kLargeMemory) return ::operator new(size, std::nothrow);
  if (size > SIZE_MAX - 2 * kLargeMemory) return nullptr;
  return MapHugePages(WholePages(size));
}

void FreeMemory(void* memory, size_t size) noexcept {
  if (size < kLargeMemory) {
    ::operator delete(memory);
  } else if (memory != nullptr) {
    munmap(memory, WholePages(size));
  }
}

}  // namespace platform
