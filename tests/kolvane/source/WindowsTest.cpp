// What a host on Windows counts on.
#include <windows.h>

#include <cstddef>

#include "kolvane/api/wrapper-framework/VRKStringTranslatorClient.h"
#include "tests/kolvane/source/PlugInTest.h"

namespace {

template <size_t size, class... Types>
constexpr bool kHaveSize = ((sizeof(Types) == size && alignof(Types) == size) && ...);

// Handles have 32 bits everywhere.
static_assert(kHaveSize<4, VRKResult, VRKPlugIn>);
static_assert(kHaveSize<4, VRKObject, VRKMessageHandler, VRKToken, VRKData, VRKList, VRKDictionary>);
static_assert(sizeof(VRKHostLiveCounts) == 36);

// What the payloads hold besides.
static_assert(sizeof(double) == 8 && sizeof(bool) == 1 && sizeof(wchar_t) == sizeof(uint16_t));

// Objects in the kernel's memory and holders: a pointer to the virtual functions, and the fields.
static_assert(sizeof(Varnel::DataRef) == 4);
#ifdef _WIN64
static_assert(kHaveSize<8, void*, size_t, VRKObjectFactoryCallback, VRKMessageHandlerCallback, VRKDataCoercionCallback>);
#else
static_assert(kHaveSize<4, void*, size_t, VRKObjectFactoryCallback, VRKMessageHandlerCallback, VRKDataCoercionCallback>);
static_assert(sizeof(VRKHostTraceArgument) == 16 && offsetof(VRKHostTraceArgument, pointer) == 12);
static_assert(sizeof(VRKHostTraceCall) == 24 && sizeof(Varnel::StringTranslatorClient) == 8);
static_assert(sizeof(Varnel::MessageHandler) == 16 && sizeof(Varnel::ObjectFactory) == 8 && sizeof(Varnel::DataCoercion) == 4);
#endif

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
