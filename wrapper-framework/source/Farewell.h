// What the kernel can still call while it is being destroyed.
#pragma once

namespace Varnel {

// An object whose destructor tells the kernel to forget it. Until that is done the kernel may call
// it, on behalf of whoever watches the kernel, and the object is no longer there to answer. Made at
// the beginning of the destructor, and asked by the callback.
class Farewell {
 public:
  explicit Farewell(const void* leavingObject) noexcept : leaving(leavingObject), outer(innermost) {
    innermost = this;
  }
  ~Farewell() { innermost = outer; }
  Farewell(const Farewell&) = delete;
  Farewell& operator=(const Farewell&) = delete;

  static bool IsSaidBy(const void* object) noexcept {
    const Farewell* each = innermost;
    while (each != nullptr && each->leaving != object) each = each->outer;
    return each != nullptr;
  }

 private:
  static inline Farewell* innermost = nullptr;

  const void* leaving;
  Farewell* outer;
};

}  // namespace Varnel
