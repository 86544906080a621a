// The rules that all holders of counted kernel handles share.
#pragma once

#include <utility>

#include "Exceptions.h"

namespace Varnel {

// Owns one reference to the thing that a kernel handle stands for, or holds the null handle. The
// kernel sees null handles like all others. Its failures are thrown, except where a reference is
// given up by a destructor, a move or Reset; a holder that an operation failed on holds what it
// held before.
//
// Traits give the type Handle, and Retain and Release of the kernel.
template <class Traits>
class HandleHolder {
 public:
  using Handle = typename Traits::Handle;

  HandleHolder() noexcept = default;

  // Takes a reference of its own.
  explicit HandleHolder(Handle borrowed) : handle(Retained(borrowed)) {}
  HandleHolder(const HandleHolder& other) : handle(Retained(other.handle)) {}
  HandleHolder(HandleHolder&& other) noexcept : handle(other.Detach()) {}
  ~HandleHolder() { Reset(); }

  HandleHolder& operator=(const HandleHolder& other) {
    Adopt(Retained(other.handle));
    return *this;
  }
  HandleHolder& operator=(HandleHolder&& other) noexcept {
    HandleHolder moved(std::move(other));
    std::swap(handle, moved.handle);
    return *this;
  }

  Handle Get() const noexcept { return handle; }
  explicit operator bool() const noexcept { return handle != Handle{}; }

  // Takes over the caller's reference, and releases the one it had. When that fails, the caller's
  // reference is released instead.
  void Adopt(Handle owned) {
    const Handle old = std::exchange(handle, owned);
    const VRKResult result = Traits::Release(old);
    if (result == 0) return;
    Traits::Release(std::exchange(handle, old));
    ThrowResultCode(result);
  }

  // Hands the reference over to the caller, and holds null.
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
