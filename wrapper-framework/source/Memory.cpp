#include "wrapper-framework/source/Memory.h"

#include <cstdint>

#include "wrapper-framework/source/VarnelKernel.h"

namespace Varnel {

const char* BadAllocation::what() const noexcept {
  return "bad allocation";
}

void* KernelMemoryPolicy::Allocate(size_t byteCount) noexcept {
  const auto count = static_cast<uint32_t>(byteCount);
  if (count != byteCount) return nullptr;
  void* block = nullptr;
  const VRKResult result = VRKMemoryAllocate(count, 0, &block);
  return result == 0 ? block : nullptr;
}

void KernelMemoryPolicy::Deallocate(void* block) noexcept {
  VRKMemoryDeallocate(block);
}

}  // namespace Varnel
