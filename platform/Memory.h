// Memory from the system, for tables that are looked into all over.
//
// Where the system has huge pages, large memory is made of them: otherwise, beyond a few megabytes,
// to find out where a page is takes longer than what is wanted of it.
#pragma once

#include <cstddef>

namespace platform {

inline constexpr size_t kHugePage = size_t{1} << 21;

// Aligned for any object. Null when there is none.
void* AllocateMemory(size_t size) noexcept;

// Frees what AllocateMemory returned for this size.
void FreeMemory(void* memory, size_t size) noexcept;

}  // namespace platform
