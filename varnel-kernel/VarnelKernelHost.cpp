// The operations of VarnelKernelHost.h. They are not traced.
#include "varnel-kernel/VarnelKernelHost.h"

#include <memory>
#include <string>
#include <utility>

#include "platform/SharedLibrary.h"
#include "varnel-kernel/Kernel.h"
#include "varnel-kernel/PlugIns.h"

using varnel_kernel::CatchAll;
using varnel_kernel::FindPlugIn;
using varnel_kernel::Kernel;
using varnel_kernel::PlugIn;

namespace {

// Trivially destructible: registering a destructor for a thread takes the loader's lock, and a
// callback that asks for the error holds the kernel's.
thread_local char gLoadError[4096];

void SetLoadError(const std::string& reason) noexcept {
  gLoadError[reason.copy(gLoadError, sizeof gLoadError - 1)] = '\0';
}

// Serves one host call: locks the kernel and runs `body` with it if it is running.
template <class Body>
VRKResult ServeHost(Body body) noexcept {
  const std::lock_guard lock(Kernel::mutex);
  Kernel* const kernel = Kernel::Running();
  return kernel != nullptr ? CatchAll([&] { return body(*kernel); }) : kVRKNotRunning;
}

template <class Handle>
VRKResult CreateHandleData(VRKToken type, Handle handle, VRKData* outData, Kernel& kernel) {
  if (outData == nullptr) return kVRKInvalidArgument;
  return kernel.values.CreateData(type, &handle, sizeof handle, *outData);
}

VRKResult AddPlugIn(platform::SharedLibrary library, const char* prefix,
                    VRKPlugIn& outPlugIn) noexcept {
  return CatchAll([&]() -> VRKResult {
    std::string reason;
    std::unique_ptr<PlugIn> plugIn = FindPlugIn(library, prefix, reason);
    SetLoadError(reason);
    if (plugIn == nullptr) return kVRKNotFound;
    return ServeHost([&](Kernel& kernel) {
      outPlugIn = kernel.plugIns.Add(std::move(plugIn));
      return kVRKNoError;
    });
  });
}

// Unloads a library that did not become a plug-in, unless its constructors installed callbacks.
void UnloadRefused(platform::SharedLibrary library) noexcept {
  const platform::AddressRange addresses = platform::AddressesOf(library);
  bool mustStay = false;
  ServeHost([&](Kernel& kernel) {
    mustStay = kernel.plugIns.MustStay(library, addresses);
    return kVRKNoError;
  });
  if (!mustStay) platform::UnloadSharedLibrary(library);
}

}  // namespace

VRKResult VRKHostStart() {
  const std::lock_guard lock(Kernel::mutex);
  return CatchAll([] { return Kernel::Start(); });
}

VRKResult VRKHostShutDown(VRKHostLiveCounts* outLive) {
  return ServeHost([=](Kernel& kernel) { return kernel.ShutDown(outLive); });
}

VRKResult VRKHostGetLiveCounts(VRKHostLiveCounts* outLive) {
  return ServeHost([=](Kernel& kernel) -> VRKResult {
    if (outLive == nullptr) return kVRKInvalidArgument;
    *outLive = kernel.LiveCounts();
    return kVRKNoError;
  });
}

// The system's loader is called without the kernel's lock: a library that calls the kernel as it is
// loaded or unloaded takes the loader's lock first, then the kernel's.

VRKResult VRKHostPlugInLoad(const char* path, const char* prefix, VRKPlugIn* outPlugIn) {
  SetLoadError({});
  const bool given = path != nullptr && *path != 0 && prefix != nullptr && outPlugIn != nullptr;
  const VRKResult ready =
      ServeHost([=](Kernel&) { return given ? kVRKNoError : kVRKInvalidArgument; });
  if (ready != kVRKNoError) return ready;
  return CatchAll([&]() -> VRKResult {
    std::string reason;
    const platform::SharedLibrary library = platform::LoadSharedLibrary(path, reason);
    SetLoadError(reason);
    if (library == nullptr) return kVRKNotFound;
    const VRKResult result = AddPlugIn(library, prefix, *outPlugIn);
    if (result != kVRKNoError) UnloadRefused(library);
    return result;
  });
}

const char* VRKHostLoadError() {
  return gLoadError;
}

VRKResult VRKHostPlugInInitialize(VRKPlugIn plugIn) {
  return ServeHost([=](Kernel& kernel) { return kernel.plugIns.Initialize(plugIn); });
}

VRKResult VRKHostPlugInTerminate(VRKPlugIn plugIn) {
  return ServeHost([=](Kernel& kernel) { return kernel.plugIns.Terminate(plugIn); });
}

VRKResult VRKHostPlugInVersion(VRKPlugIn plugIn, uint32_t* outVersion) {
  return ServeHost([=](Kernel& kernel) -> VRKResult {
    if (outVersion == nullptr) return kVRKInvalidArgument;
    return kernel.plugIns.Version(plugIn, *outVersion);
  });
}

VRKResult VRKHostPlugInUnload(VRKPlugIn plugIn) {
  platform::SharedLibrary library = nullptr;
  const VRKResult result =
      ServeHost([&](Kernel& kernel) { return kernel.plugIns.Remove(plugIn, library); });
  if (library != nullptr) platform::UnloadSharedLibrary(library);
  return result;
}

VRKResult VRKHostListCreate(VRKList* outList) {
  return ServeHost([=](Kernel& kernel) -> VRKResult {
    return outList != nullptr ? kernel.values.CreateList(*outList) : kVRKInvalidArgument;
  });
}

VRKResult VRKHostListAppend(VRKList list, VRKData data) {
  return ServeHost([=](Kernel& kernel) { return kernel.values.Append(list, data); });
}

VRKResult VRKHostTokenDataCreate(VRKToken token, VRKData* outData) {
  return ServeHost([=](Kernel& kernel) {
    return CreateHandleData(kernel.values.tokenType, token, outData, kernel);
  });
}

VRKResult VRKHostListDataCreate(VRKList list, VRKData* outData) {
  return ServeHost([=](Kernel& kernel) {
    return CreateHandleData(kernel.values.listType, list, outData, kernel);
  });
}

VRKResult VRKHostDictionaryDataCreate(VRKDictionary dictionary, VRKData* outData) {
  return ServeHost([=](Kernel& kernel) {
    return CreateHandleData(kernel.values.dictionaryType, dictionary, outData, kernel);
  });
}

VRKResult VRKHostSetTraceHook(VRKHostTraceHook hook, void* context) {
  return ServeHost([=](Kernel& kernel) -> VRKResult {
    kernel.trace.Set(hook, context);
    return kVRKNoError;
  });
}

VRKResult VRKHostSetErrorReporter(VRKHostErrorReporter reporter, void* context) {
  return ServeHost([=](Kernel& kernel) -> VRKResult {
    kernel.reports.Set(reporter, context);
    return kVRKNoError;
  });
}
