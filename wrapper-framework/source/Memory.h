// Memory of the kernel for the objects that it calls back into.
#pragma once

#include <cstddef>
#include <new>

namespace Varnel {

// What operator new throws where the kernel has no memory; its text is "bad allocation".
class BadAllocation : public std::bad_alloc {
 public:
  const char* what() const noexcept override;
};

struct KernelMemoryPolicy {
  static void* Allocate(size_t byteCount) noexcept;  // null when there is none
  static void Deallocate(void* block) noexcept;
};

// Objects of classes derived from this one come out of the policy's memory when they are made with
// new, and go back there.
template <class Policy>
class Memory {
 public:
  static void* operator new(size_t byteCount) {
    void* const block = Policy::Allocate(byteCount);
    if (block == nullptr) throw BadAllocation();
    return block;
  }

  static void operator delete(void* block) noexcept { Policy::Deallocate(block); }

 protected:
  Memory() = default;
  ~Memory() = default;
};

}  // namespace Varnel
