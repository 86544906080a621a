#include <windows.h>

#include <system_error>

#include "SharedLibrary.h"

namespace platform {
namespace {

// From UTF-8; empty when the path cannot be converted.
std::wstring WidePath(const char* path) {
  const int length = ::MultiByteToWideChar(CP_UTF8, 0, path, -1, nullptr, 0);
  std::wstring wide(static_cast<size_t>(length), L'\0');
  ::MultiByteToWideChar(CP_UTF8, 0, path, -1, wide.data(), length);
  return wide;
}

}  // namespace

SharedLibrary LoadSharedLibrary(const char* path, std::string& reason) {
  const HMODULE library = ::LoadLibraryW(WidePath(path).c_str());
  if (library == nullptr) {
    reason = std::system_category().message(static_cast<int>(::GetLastError()));
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
