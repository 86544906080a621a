// Protects objects that the kernel can still call while they are being destroyed.
#pragma once

namespace Varnel {

// Marks an object as being destroyed, from the start of its destructor until its registration has
// ended. A trace hook or another thread may make the kernel call the object meanwhile; its callback
// asks IsDestroying and does not touch it. The scopes form a stack on the C++ stack, like the
// destructors.
class DestructionScope {
 public:
  explicit DestructionScope(const void* leavingObject) noexcept
      : leaving(leavingObject), outer(innermost) {
    innermost = this;
  }
  ~DestructionScope() { innermost = outer; }
  DestructionScope(const DestructionScope&) = delete;
  DestructionScope& operator=(const DestructionScope&) = delete;

  static bool IsDestroying(const void* object) noexcept {
    const DestructionScope* each = innermost;
    while (each != nullptr && each->leaving != object) each = each->outer;
    return each != nullptr;
  }

 private:
  static inline DestructionScope* innermost = nullptr;

  const void* leaving;
  DestructionScope* outer;
};

}  // namespace Varnel
