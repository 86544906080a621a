// Loading libraries while a program runs.
#pragma once

#include <string>

namespace platform {

// A loaded library; null for none.
using SharedLibrary = void*;

// Null when the library cannot be loaded; `reason` then says why, in the system's words.
SharedLibrary LoadSharedLibrary(const char* path, std::string& reason);
void UnloadSharedLibrary(SharedLibrary library) noexcept;

// The address of a function that the library exports, or null.
void* FindFunction(SharedLibrary library, const char* name) noexcept;

// What the address belongs to: equal for two addresses in the same library or program, null for an
// address in neither.
const void* ModuleOf(const void* address) noexcept;

}  // namespace platform
