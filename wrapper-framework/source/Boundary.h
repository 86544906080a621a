// The way from the kernel into C++ and back.
#pragma once

#include <utility>

#include "Exceptions.h"

namespace Varnel {

// Returns the result code that `body` returns, or that of what it throws. Nothing gets past it, and
// it takes no memory. `errorInfo` is the dictionary for a CustomErrorException, or null.
template <class Body>
VRKResult AtBoundary(VRKDictionary errorInfo, Body&& body) noexcept {
  try {
    return std::forward<Body>(body)();
  } catch (...) {
    return ResultCodeFromException(errorInfo);
  }
}

}  // namespace Varnel
