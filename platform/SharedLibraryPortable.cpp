#include <dlfcn.h>
#include <link.h>

#include <algorithm>

#include "platform/SharedLibrary.h"

namespace platform {
namespace {

AddressRange SegmentsOf(const dl_phdr_info& object) noexcept {
  AddressRange range{UINTPTR_MAX, 0};
  for (ElfW(Half) i = 0; i < object.dlpi_phnum; ++i) {
    const ElfW(Phdr)& segment = object.dlpi_phdr[i];
    if (segment.p_type != PT_LOAD) continue;
    const uintptr_t begin = object.dlpi_addr + segment.p_vaddr;
    range.begin = std::min(range.begin, begin);
    range.end = std::max<uintptr_t>(range.end, begin + segment.p_memsz);
  }
  return range;
}

struct Search {
  const void* address;
  AddressRange found;
};

int FindObjectAt(dl_phdr_info* object, size_t, void* context) noexcept {
  auto& search = *static_cast<Search*>(context);
  const AddressRange range = SegmentsOf(*object);
  if (!range.Contains(search.address)) return 0;
  search.found = range;
  return 1;
}

}  // namespace

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

AddressRange AddressesOf(SharedLibrary library) noexcept {
  Search search{nullptr, {0, UINTPTR_MAX}};
  link_map* map = nullptr;
  if (dlinfo(library, RTLD_DI_LINKMAP, &map) != 0) return search.found;
  search.address = map->l_ld;
  dl_iterate_phdr(FindObjectAt, &search);
  return search.found;
}

}  // namespace platform
