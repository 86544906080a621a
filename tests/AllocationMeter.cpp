#include "AllocationMeter.h"

#include <cstdlib>
#include <new>

namespace {

bool gWatching = false;
bool gFailed = false;
size_t gTotalBytes = 0;
ptrdiff_t gLiveBlocks = 0;
size_t gUntilFailure = 0;

bool MayAllocate(size_t size) {
  if (!gWatching) return true;
  gTotalBytes += size;
  gFailed |= gUntilFailure == 1;
  if (gUntilFailure != 0 && --gUntilFailure == 0) return false;
  ++gLiveBlocks;
  return true;
}

void Free(void* block) {
  if (gWatching && block != nullptr) --gLiveBlocks;
  std::free(block);
}

}  // namespace

AllocationMeter::AllocationMeter(size_t failAt) {
  gFailed = false;
  gTotalBytes = 0;
  gLiveBlocks = 0;
  gUntilFailure = failAt;
  gWatching = true;
}

AllocationMeter::~AllocationMeter() {
  gWatching = false;
}

size_t AllocationMeter::TotalBytes() const {
  return gTotalBytes;
}
ptrdiff_t AllocationMeter::LiveBlocks() const {
  return gLiveBlocks;
}
bool AllocationMeter::Failed() const {
  return gFailed;
}

void* operator new(size_t size) {
  void* const block = MayAllocate(size) ? std::malloc(size != 0 ? size : 1) : nullptr;
  if (block == nullptr) throw std::bad_alloc();
  return block;
}

void* operator new(size_t size, const std::nothrow_t&) noexcept {
  return MayAllocate(size) ? std::malloc(size != 0 ? size : 1) : nullptr;
}

void* operator new[](size_t size) {
  return operator new(size);
}
void* operator new[](size_t size, const std::nothrow_t& tag) noexcept {
  return operator new(size, tag);
}
void operator delete(void* block) noexcept {
  Free(block);
}
void operator delete[](void* block) noexcept {
  Free(block);
}
void operator delete(void* block, size_t) noexcept {
  Free(block);
}
void operator delete[](void* block, size_t) noexcept {
  Free(block);
}
void operator delete(void* block, const std::nothrow_t&) noexcept {
  Free(block);
}
void operator delete[](void* block, const std::nothrow_t&) noexcept {
  Free(block);
}
