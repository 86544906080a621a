#include <dlfcn.h>

#include "SharedLibrary.h"

namespace platform {

SharedLibrary LoadSharedLibrary(const char* path, std::string& reason) {
  void* const library = dlopen(path, RTLD_NOW | RTLD_LOCAL);
  if (library == nullptr) reason = dlerror();
  return library;
}

void UnloadSharedLibrary(SharedLibrary library) noexcept {
  dlclose(library);
}

void* FindFunction(SharedLibrary library, const char* name) noexcept {
  return dlsym(library, name);
}

const void* ModuleOf(const void* address) noexcept {
  Dl_info info;
  return dladdr(address, &info) != 0 ? info.dli_fbase : nullptr;
}

}  // namespace platform
