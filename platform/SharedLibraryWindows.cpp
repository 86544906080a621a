#include <windows.h>

#include <system_error>

#include "SharedLibrary.h"
#include "WideText.h"

namespace platform {
SharedLibrary LoadSharedLibrary(const char* path, std::string& reason) {
  const HMODULE library = ::LoadLibraryW(WideFromUTF8(path).c_str());
  if (library == nullptr) {
    const int error = static_cast<int>(::GetLastError());
    reason = path + (": " + std::system_category().message(error));
  }
  return library;
}

void UnloadSharedLibrary(SharedLibrary library) noexcept {
  ::FreeLibrary(static_cast<HMODULE>(library));
}

void* FindFunction(SharedLibrary library, const char* name) noexcept {
  return reinterpret_cast<void*>(::GetProcAddress(static_cast<HMODULE>(library), name));
}

const void* ModuleOf(const void* address) noexcept {
  HMODULE module = nullptr;
  ::GetModuleHandleExW(
      GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
      static_cast<LPCWSTR>(address), &module);
  return module;
}

}  // namespace platform
