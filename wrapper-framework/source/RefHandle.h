// The template of the four owning kernel handles (KernelRefs.h).
#pragma once

#include <utility>

#include "wrapper-framework/source/Exceptions.h"

namespace Varnel {

// Owns one reference to a kernel item, or holds the null handle, which is passed to the kernel like
// any other. An operation that throws leaves the holder unchanged. `Traits` provides the type
// Handle and the kernel's Retain and Release.
//
// Throws: Exception with the kernel's code, except from destructors, moves and Reset.
template <class Traits>
class RefHandle {
 public:
  using Handle = typename Traits::Handle;

  RefHandle() noexcept = default;

  // Retains the handle.
  explicit RefHandle(Handle borrowed) : handle(Retained(borrowed)) {}
  RefHandle(const RefHandle& other) : handle(Retained(other.handle)) {}
  RefHandle(RefHandle&& other) noexcept : handle(other.Detach()) {}
  ~RefHandle() { Reset(); }

  RefHandle& operator=(const RefHandle& other) {
    Adopt(Retained(other.handle));
    return *this;
  }
  RefHandle& operator=(RefHandle&& other) noexcept {
    RefHandle moved(std::move(other));
    std::swap(handle, moved.handle);
    return *this;
  }

  Handle Get() const noexcept { return handle; }
  explicit operator bool() const noexcept { return handle != Handle{}; }

  // Takes ownership of the caller's reference, also if it throws, and releases the old one. If that
  // release fails, the holder keeps the old reference and releases the caller's.
  void Adopt(Handle owned) {
    const Handle old = std::exchange(handle, owned);
    const VRKResult result = Traits::Release(old);
    if (result == 0) return;
    Traits::Release(std::exchange(handle, old));
    ThrowResultCode(result);
  }

  // Gives ownership of the reference to the caller. The holder is null afterwards.
  [[nodiscard]] Handle Detach() noexcept { return std::exchange(handle, Handle{}); }

  void Reset() noexcept { Traits::Release(Detach()); }

 private:
  static Handle Retained(Handle borrowed) {
    ThrowIfFailed(Traits::Retain(borrowed));
    return borrowed;
  }

  Handle handle{};
};

}  // namespace Varnel
