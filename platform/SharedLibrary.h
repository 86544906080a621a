// Loading of shared libraries at run time.
//
// All functions take the system's loader lock, under which constructors and destructors of
// libraries run too. Requires: the caller holds no lock that such code takes.
#pragma once

#include <cstdint>
#include <string>

namespace platform {

// A loaded library, or null.
using SharedLibrary = void*;

// Returns null and sets `reason` to the system's message if the library cannot be loaded.
SharedLibrary LoadSharedLibrary(const char* path, std::string& reason);
void UnloadSharedLibrary(SharedLibrary library) noexcept;

// Returns the address of an exported function, or null.
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

// Returns the addresses of the library, valid until it is unloaded; all addresses if they are
// unknown.
AddressRange AddressesOf(SharedLibrary library) noexcept;

}  // namespace platform
