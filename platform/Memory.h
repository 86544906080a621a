// Allocator for large tables with random access. Uses huge pages where the system has them, to save
// TLB misses.
#pragma once

#include <cstddef>

namespace platform {

inline constexpr size_t kHugePage = size_t{1} << 21;

// Aligned for any object. Returns null if there is no memory.
void* AllocateMemory(size_t size) noexcept;

// Frees memory that AllocateMemory returned for this size.
void FreeMemory(void* memory, size_t size) noexcept;

}  // namespace platform
