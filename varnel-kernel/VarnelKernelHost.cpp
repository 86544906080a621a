// The operations of VarnelKernelHost.h. They are not traced.
#include "VarnelKernelHost.h"

#include <string>

#include "Kernel.h"

using varnel_kernel::Guarded;
using varnel_kernel::Kernel;

namespace {

thread_local std::string gLoadError;

// Serves one of the host's calls in its turn, on a kernel that is running.
template <class Body>
VRKResult ServeHost(Body body) noexcept {
  Kernel& kernel = Kernel::Instance();
  const std::lock_guard lock(kernel.mutex);
  return kernel.isRunning ? Guarded([&] { return body(kernel); }) : kVRKNotRunning;
}

template <class Handle>
VRKResult CreateHandleData(VRKToken type, Handle handle, VRKData* outData, Kernel& kernel) {
  if (outData == nullptr) return kVRKInvalidArgument;
  return kernel.values.CreateData(type, &handle, sizeof handle, *outData);
}

}  // namespace

VRKResult VRKHostStart() {
  const std::lock_guard lock(Kernel::Instance().mutex);
  return Kernel::Instance().Start();
}

VRKResult VRKHostShutDown(VRKHostLiveCounts* outLive) {
  const std::lock_guard lock(Kernel::Instance().mutex);
  return Kernel::Instance().ShutDown(outLive);
}

VRKResult VRKHostGetLiveCounts(VRKHostLiveCounts* outLive) {
  return ServeHost([=](Kernel& kernel) -> VRKResult {
    if (outLive == nullptr) return kVRKInvalidArgument;
    *outLive = kernel.LiveCounts();
    return kVRKNoError;
  });
}

VRKResult VRKHostPlugInLoad(const char* path, const char* prefix, VRKPlugIn* outPlugIn) {
  return ServeHost([=](Kernel& kernel) -> VRKResult {
    const bool given = path != nullptr && prefix != nullptr && outPlugIn != nullptr;
    return given ? kernel.plugIns.Load(path, prefix, *outPlugIn, gLoadError) : kVRKInvalidArgument;
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
  return ServeHost([=](Kernel& kernel) { return kernel.plugIns.Unload(plugIn); });
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
    kernel.reporter = reporter;
    kernel.reporterContext = context;
    return kVRKNoError;
  });
}
