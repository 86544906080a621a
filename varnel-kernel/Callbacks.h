// What the kernel keeps of a callback, and what it knows of those that are running.
#pragma once

#include <cstdint>

#include "VarnelKernel.h"

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

// Calls code that is not the kernel's own. Should it throw, which it must not, `onThrow` is the
// result.
template <class Result, class Function, class... Arguments>
Result CallOut(RunningCode*& innermost, Result onThrow, Function function,
               Arguments... arguments) noexcept {
  const RunningCode code(innermost, function);
  try {
    return function(arguments...);
  } catch (...) {
    return onThrow;
  }
}

}  // namespace varnel_kernel
