// What a 32-bit host on Windows counts on.
#include <windows.h>

#include <cstddef>

#include "PlugInTest.h"
#include "VRKStringTranslatorClient.h"

namespace {

template <class... Types>
constexpr bool kAreOf32Bits = ((sizeof(Types) == 4 && alignof(Types) == 4) && ...);

static_assert(kAreOf32Bits<void*, size_t, VRKResult, VRKPlugIn>);
static_assert(kAreOf32Bits<VRKObject, VRKMessageHandler, VRKToken, VRKData, VRKList, VRKDictionary>);
static_assert(kAreOf32Bits<VRKObjectFactoryCallback, VRKMessageHandlerCallback, VRKDataCoercionCallback>);
static_assert(sizeof(VRKHostTraceArgument) == 16 && offsetof(VRKHostTraceArgument, pointer) == 12);
static_assert(sizeof(VRKHostTraceCall) == 24 && sizeof(VRKHostLiveCounts) == 36);

// What the payloads hold besides.
static_assert(sizeof(double) == 8 && sizeof(bool) == 1 && sizeof(wchar_t) == sizeof(uint16_t));

// What lives in the kernel's memory and in holders: a table of operations, and the fields.
static_assert(sizeof(Varnel::DataRef) == 4 && sizeof(Varnel::StringTranslatorClient) == 8);
static_assert(sizeof(Varnel::MessageHandler) == 16 && sizeof(Varnel::ObjectFactory) == 8 && sizeof(Varnel::DataCoercion) == 4);

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
