#include <new>

#include "platform/Memory.h"

namespace platform {

// Large pages require a privilege on Windows that hosts do not have.
void* AllocateMemory(size_t size) noexcept {
  return ::operator new(size, std::nothrow);
}

void FreeMemory(void* memory, size_t) noexcept {
  ::operator delete(memory);
}

}  // namespace platform
