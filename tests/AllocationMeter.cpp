#include "tests/AllocationMeter.h"

#include <malloc.h>

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <new>

namespace {

std::atomic<ptrdiff_t> gLiveBlocks = 0;
bool gIsSystem = false;  // memory is taken from the system or given back, and counted as that

// While there is a meter:
Fault* gFault = nullptr;
size_t gMost = 0;
size_t gTotalBytes = 0;
ptrdiff_t gBlocksBefore = 0;
ptrdiff_t gLiveBytes = 0;
ptrdiff_t gPeakBytes = 0;

bool MayAllocate(size_t size) {
  if (gFault == nullptr || gIsSystem) return true;
  const bool isTooLarge = size > gMost;
  gFault->hasFired |= isTooLarge;
  return !gFault->Strikes() && !isTooLarge;
}

void CountAllocated(size_t size) {
  if (gIsSystem) return;
  ++gLiveBlocks;
  if (gFault == nullptr) return;
  gTotalBytes += size;
  gLiveBytes += static_cast<ptrdiff_t>(size);
  gPeakBytes = std::max(gPeakBytes, gLiveBytes);
}

void CountFreed(size_t size) {
  if (gIsSystem) return;
  --gLiveBlocks;
  if (gFault != nullptr) gLiveBytes -= static_cast<ptrdiff_t>(size);
}

size_t SizeOf(void* block) {
#ifdef _WIN32
  return _msize(block);
#else
  return malloc_usable_size(block);
#endif
}

void* Allocate(size_t size) {
  void* const block = MayAllocate(size) ? std::malloc(size != 0 ? size : 1) : nullptr;
  if (block != nullptr) CountAllocated(gFault != nullptr ? SizeOf(block) : size);
  return block;
}

void Free(void* block) {
  if (block != nullptr) CountFreed(gFault != nullptr ? SizeOf(block) : 0);
  std::free(block);
}

}  // namespace

#ifdef MEMORY_IS_WRAPPED

// The names that the linker gives platform::AllocateMemory and FreeMemory, which take large memory
// from the system and other from operator new, and what stands in for them.
extern "C" {
void* __real__ZN8platform14AllocateMemoryEm(size_t size) noexcept;
void __real__ZN8platform10FreeMemoryEPvm(void* memory, size_t size) noexcept;

void* __wrap__ZN8platform14AllocateMemoryEm(size_t size) noexcept {
  if (!MayAllocate(size)) return nullptr;
  gIsSystem = true;
  void* const memory = __real__ZN8platform14AllocateMemoryEm(size);
  gIsSystem = false;
  if (memory != nullptr) CountAllocated(size);
  return memory;
}

void __wrap__ZN8platform10FreeMemoryEPvm(void* memory, size_t size) noexcept {
  if (memory != nullptr) CountFreed(size);
  gIsSystem = true;
  __real__ZN8platform10FreeMemoryEPvm(memory, size);
  gIsSystem = false;
}
}

#endif

AllocationMeter::AllocationMeter(Fault& fault, size_t most) {
  gMost = most;
  gTotalBytes = 0;
  gBlocksBefore = gLiveBlocks;
  gLiveBytes = 0;
  gPeakBytes = 0;
  gFault = &fault;
}

AllocationMeter::~AllocationMeter() {
  gFault = nullptr;
}

bool AllocationMeter::Failed() const {
  return gFault->hasFired;
}
size_t AllocationMeter::TotalBytes() const {
  return gTotalBytes;
}
ptrdiff_t AllocationMeter::LiveBlocks() const {
  return gLiveBlocks - gBlocksBefore;
}
ptrdiff_t AllocationMeter::LiveBytes() const {
  return gLiveBytes;
}
ptrdiff_t AllocationMeter::PeakBytes() const {
  return gPeakBytes;
}
ptrdiff_t AllocationMeter::LiveBlocksInAll() {
  return gLiveBlocks;
}

void* operator new(size_t size) {
  void* const block = Allocate(size);
  if (block == nullptr) throw std::bad_alloc();
  return block;
}

void* operator new(size_t size, const std::nothrow_t&) noexcept {
  return Allocate(size);
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
