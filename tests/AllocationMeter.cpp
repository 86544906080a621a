#include "AllocationMeter.h"

#include <atomic>
#include <cstdlib>
#include <new>

namespace {

Fault* gFault = nullptr;  // while there is a meter
size_t gTotalBytes = 0;
ptrdiff_t gBlocksBefore = 0;
std::atomic<ptrdiff_t> gLiveBlocks = 0;

void* Allocate(size_t size) {
  if (gFault != nullptr) {
    gTotalBytes += size;
    if (gFault->Strikes()) return nullptr;
  }
  ++gLiveBlocks;
  return std::malloc(size != 0 ? size : 1);
}

void Free(void* block) {
  if (block != nullptr) --gLiveBlocks;
  std::free(block);
}

}  // namespace

AllocationMeter::AllocationMeter(Fault& fault) {
  gTotalBytes = 0;
  gBlocksBefore = gLiveBlocks;
  gFault = &fault;
}

AllocationMeter::~AllocationMeter() {
  gFault = nullptr;
}

size_t AllocationMeter::TotalBytes() const {
  return gTotalBytes;
}
ptrdiff_t AllocationMeter::LiveBlocks() const {
  return gLiveBlocks - gBlocksBefore;
}
bool AllocationMeter::Failed() const {
  return gFault->hasFired;
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
