// Registered callbacks, and the stack of those that are running.
#pragma once

#include <cstdint>

#include "wrapper-framework/source/VarnelKernel.h"

namespace varnel_kernel {

// Identified by the pair of function and context.
template <class Function>
struct Callback {
  Function function;
  void* context;

  bool operator==(const Callback&) const = default;
};

// One call out of the kernel that has not returned yet. The objects form a stack, linked from the
// innermost call outwards; they live on the C++ stack.
class ActiveCallback {
 public:
  template <class Function>
  ActiveCallback(ActiveCallback*& innermostCode, Function function) noexcept
      : innermost(innermostCode), outer(innermostCode), address(reinterpret_cast<void*>(function)) {
    innermost = this;
  }
  ~ActiveCallback() { innermost = outer; }
  ActiveCallback(const ActiveCallback&) = delete;
  ActiveCallback& operator=(const ActiveCallback&) = delete;

  const ActiveCallback* Outer() const noexcept { return outer; }
  const void* Address() const noexcept { return address; }

 private:
  ActiveCallback*& innermost;
  ActiveCallback* outer;
  const void* address;
};

// Calls code outside the kernel. Returns `onThrow` if that code throws, which its contract forbids.
template <class Result, class Function, class... Arguments>
Result CallOut(ActiveCallback*& innermost, Result onThrow, Function function,
               Arguments... arguments) noexcept {
  const ActiveCallback code(innermost, function);
  try {
    return function(arguments...);
  } catch (...) {
    return onThrow;
  }
}

}  // namespace varnel_kernel
