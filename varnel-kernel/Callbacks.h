// What the kernel keeps of a callback, and what it knows of those that are running.
#pragma once

#include <cstdint>

namespace varnel_kernel {

// Two callbacks are the same when both their function and their context are.
template <class Function>
struct Callback {
  Function function;
  void* context;

  bool operator==(const Callback&) const = default;
};

// Code that the kernel has called and that has not returned yet: a chain through the stack, from
// the innermost call outwards.
class RunningCode {
 public:
  template <class Function>
  RunningCode(RunningCode*& innermostCode, Function function) noexcept
      : innermost(innermostCode), outer(innermostCode), address(reinterpret_cast<void*>(function)) {
    innermost = this;
  }
  ~RunningCode() { innermost = outer; }
  RunningCode(const RunningCode&) = delete;
  RunningCode& operator=(const RunningCode&) = delete;

  const RunningCode* Outer() const noexcept { return outer; }
  const void* Address() const noexcept { return address; }

 private:
  RunningCode*& innermost;
  RunningCode* outer;
  const void* address;
};

}  // namespace varnel_kernel
