// Loading libraries while a program runs.
//
// All functions take the system's loader lock, under which a library's constructors and destructors
// run too. Callers hold no lock that such code may want.
#pragma once

#include <cstdint>
#include <string>

namespace platform {

// A loaded library; null for none.
using SharedLibrary = void*;

// Null when the library cannot be loaded; `reason` then says why, in the system's words.
SharedLibrary LoadSharedLibrary(const char* path, std::string& reason);
void UnloadSharedLibrary(SharedLibrary library) noexcept;

// The address of a function that the library exports, or null.
void* FindFunction(SharedLibrary library, const char* name) noexcept;

// The addresses from `begin` to just below `end`.
struct AddressRange {
  bool Contains(const void* address) const noexcept {
    const auto value = reinterpret_cast<uintptr_t>(address);
    return begin <= value && value < end;
  }

  uintptr_t begin;
  uintptr_t end;
};

// Where the library is in memory until it is unloaded; all addresses if the system does not say.
AddressRange AddressesOf(SharedLibrary library) noexcept;

}  // namespace platform
