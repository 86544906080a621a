// What a 32-bit host on Windows counts on.
#include <windows.h>

#include "PlugInTest.h"

namespace {

static_assert(sizeof(void*) == 4 && sizeof(size_t) == 4 && sizeof(VRKMessageHandlerCallback) == 4);
static_assert(sizeof(wchar_t) == 2 && sizeof(double) == 8 && sizeof(bool) == 1);

TEST(PlugInOnWindows, IsFoundByOrdinalsAndNames) {
  const EntryPoints entry;
  const auto library = static_cast<HMODULE>(entry.library);
  const char* const names[] = {"VRKKolvanesInitialize", "VRKKolvanesTerminate", "VRKKolvanesVersion"};
  for (WORD i = 0; i < 3; ++i) {
    const auto byOrdinal = ::GetProcAddress(library, reinterpret_cast<LPCSTR>(uintptr_t{i} + 1));
    EXPECT_NE(byOrdinal, nullptr);
    EXPECT_EQ(byOrdinal, ::GetProcAddress(library, names[i]));
  }
  EXPECT_EQ(::GetProcAddress(library, reinterpret_cast<LPCSTR>(uintptr_t{4})), nullptr);
}

}  // namespace
