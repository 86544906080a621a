// The operations of VarnelKernelHost.h. They are not traced.
#include "VarnelKernelHost.h"

#include <string>

#include "Kernel.h"
#include "SharedLibrary.h"

using varnel_kernel::Guarded;
using varnel_kernel::Kernel;

namespace {

thread_local std::string gLoadError;

// Serves one of the host's calls in its turn, on a kernel that is running.
template <class Body>
VRKResult ServeHost(Body body) noexcept {
  const std::lock_guard lock(Kernel::mutex);
  Kernel* const kernel = Kernel::Running();
  return kernel != nullptr ? Guarded([&] { return body(*kernel); }) : kVRKNotRunning;
}

template <class Handle>
VRKResult CreateHandleData(VRKToken type, Handle handle, VRKData* outData, Kernel& kernel) {
  if (outData == nullptr) return kVRKInvalidArgument;
  return kernel.values.CreateData(type, &handle, sizeof handle, *outData);
}

}  // namespace

VRKResult VRKHostStart() {
  const std::lock_guard lock(Kernel::mutex);
  return Guarded([] { return Kernel::Start(); });
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

// Libraries are loaded and unloaded out of turn: the system's loader has a lock of its own, under
// which a library may call the kernel. One that did so and is no plug-in stays loaded.
VRKResult VRKHostPlugInLoad(const char* path, const char* prefix, VRKPlugIn* outPlugIn) {
  gLoadError.clear();
  const bool given = path != nullptr && *path != 0 && prefix != nullptr && outPlugIn != nullptr;
  uint32_t installedBefore = 0;
  const VRKResult ready = ServeHost([&](Kernel& kernel) -> VRKResult {
    installedBefore = kernel.plugIns.InstalledCount();
    return given ? kVRKNoError : kVRKInvalidArgument;
  });
  if (ready != kVRKNoError) return ready;
  return Guarded([&]() -> VRKResult {
    const platform::SharedLibrary library = platform::LoadSharedLibrary(path, gLoadError);
    if (library == nullptr) return kVRKNotFound;
    bool isInstalled = false;
    const VRKResult result = ServeHost([&](Kernel& kernel) {
      isInstalled = kernel.plugIns.InstalledCount() > installedBefore;
      return kernel.plugIns.Add(library, prefix, *outPlugIn, gLoadError);
    });
    if (result != kVRKNoError && !isInstalled) platform::UnloadSharedLibrary(library);
    return result;
  });
}

const char* VRKHostLoadError() {
  return gLoadError.c_str();
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
