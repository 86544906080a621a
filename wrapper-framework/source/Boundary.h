// The exception boundary between the kernel and C++ code that it calls.
#pragma once

#include <utility>

#include "wrapper-framework/source/Exceptions.h"

namespace Varnel {

// Returns the result code of `body`, or that of the exception which it throws. Never throws or
// allocates. `errorInfo` is passed to ResultCodeFromException, and may be null.
template <class Body>
VRKResult AtBoundary(VRKDictionary errorInfo, Body&& body) noexcept {
  try {
    return std::forward<Body>(body)();
  } catch (...) {
    return ResultCodeFromException(errorInfo);
  }
}

}  // namespace Varnel
