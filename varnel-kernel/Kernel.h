// The process's one kernel, and the way that every call takes into it.
#pragma once

#include <array>
#include <mutex>
#include <new>

#include "Callbacks.h"
#include "Coercions.h"
#include "HandleTable.h"
#include "Objects.h"
#include "PlugIns.h"
#include "TokenTable.h"
#include "Trace.h"
#include "Values.h"
#include "VarnelKernelHost.h"

namespace varnel_kernel {

// The parts, in the order in which they stand on each other. Tokens, and the number of times that a
// handle's slot was used, outlive a shut-down: code that was loaded before it keeps both.
class Kernel {
 public:
  // Never destroyed: libraries may call into the kernel until the process's last moment.
  static Kernel& Instance();

  VRKResult Start() noexcept;
  VRKResult ShutDown(VRKHostLiveCounts* outLive) noexcept;
  VRKHostLiveCounts LiveCounts() const noexcept;

  std::recursive_mutex mutex;
  bool isRunning = false;
  RunningCode* innermostCode = nullptr;
  uint32_t memoryBlocks = 0;
  Trace trace;
  VRKHostErrorReporter reporter = nullptr;
  void* reporterContext = nullptr;

  TokenTable tokens;
  HandleTable handles;
  Values values{handles, tokens};
  Objects objects{handles, tokens, values, innermostCode};
  Coercions coercions{handles, tokens, values, innermostCode};
  PlugIns plugIns{handles, objects, coercions, innermostCode};
};

// No exception gets out: the kernel itself only runs out of memory, and callbacks should not throw.
template <class Body>
VRKResult Guarded(Body body) noexcept {
  try {
    return body();
  } catch (const std::bad_alloc&) {
    return kVRKOutOfMemory;
  } catch (...) {
    return kVRKCallbackThrew;
  }
}

template <class Body, class... Arguments>
VRKResult Traced(Trace& trace, const char* operation, Body body, Arguments... arguments) {
  const std::array before{Describe(arguments, false)...};
  VRKResult result = trace.Enter(operation, before);
  if (result == kVRKNoError) result = body();
  const std::array after{Describe(arguments, result == kVRKNoError)...};
  trace.Leave(operation, after, result);
  return result;
}

// Serves one call: waits for its turn, tells the trace, runs `body` with the kernel.
template <class Body, class... Arguments>
VRKResult Serve(const char* operation, Body body, Arguments... arguments) noexcept {
  Kernel& kernel = Kernel::Instance();
  const std::lock_guard lock(kernel.mutex);
  if (!kernel.isRunning) return kVRKNotRunning;
  const auto run = [&] { return Guarded([&] { return body(kernel); }); };
  return kernel.trace.IsOn() ? Traced(kernel.trace, operation, run, arguments...) : run();
}

}  // namespace varnel_kernel
