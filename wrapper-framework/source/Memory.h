// Kernel memory for objects that the kernel calls back.
#pragma once

#include <cstddef>
#include <new>

namespace Varnel {

// Thrown by operator new if the kernel is out of memory; its text is "bad allocation".
class BadAllocation : public std::bad_alloc {
 public:
  const char* what() const noexcept override;
};

struct KernelMemoryPolicy {
  static void* Allocate(size_t byteCount) noexcept;  // null if there is no memory
  static void Deallocate(void* block) noexcept;
};

// Classes derived from this one allocate their objects with the policy.
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
