// The process's one kernel, and the way that every call takes into it.
#pragma once

#include <array>
#include <mutex>
#include <new>
#include <stdexcept>

#include "Callbacks.h"
#include "Coercions.h"
#include "ErrorReports.h"
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
  // Builds the kernel at its first start. It is never destroyed: libraries may call into it until
  // the process's last moment.
  static VRKResult Start();

  VRKResult ShutDown(VRKHostLiveCounts* outLive) noexcept;
  VRKHostLiveCounts LiveCounts() const noexcept;

  // Held by whoever uses what follows.
  static inline std::recursive_mutex mutex;
  static inline Kernel* built = nullptr;

  static Kernel* Running() noexcept {
    return built != nullptr && built->isRunning ? built : nullptr;
  }

  RunningCode* innermostCode = nullptr;
  uint32_t memoryBlocks = 0;
  Trace trace{innermostCode};
  ErrorReports reports{innermostCode};

  TokenTable tokens;
  HandleTable handles;
  Values values{handles, tokens};
  Objects objects{handles, tokens, values, innermostCode};
  Coercions coercions{handles, tokens, values, innermostCode};
  PlugIns plugIns{handles, objects, coercions, trace, reports, innermostCode};

 private:
  bool isRunning = false;
};

// No exception gets out. The kernel has none but those of memory that ran out.
template <class Body>
VRKResult Guarded(Body body) noexcept {
  try {
    return body();
  } catch (const std::bad_alloc&) {
    return kVRKOutOfMemory;
  } catch (const std::length_error&) {  // a vector that 32 bits cannot address
    return kVRKOutOfMemory;
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

// Runs `body` with a kernel, which may be null, and traces the call. Requires the kernel's lock.
template <class Body, class... Arguments>
VRKResult RunTraced(Kernel* kernel, const char* operation, Body body,
                    Arguments... arguments) noexcept {
  if (kernel == nullptr) return kVRKNotRunning;
  const auto run = [&] { return Guarded([&] { return body(*kernel); }); };
  return kernel->trace.IsOn() ? Traced(kernel->trace, operation, run, arguments...) : run();
}

// Serves one call: locks the kernel, traces the call, runs `body` with the running kernel.
template <class Body, class... Arguments>
VRKResult Serve(const char* operation, Body body, Arguments... arguments) noexcept {
  const std::lock_guard lock(Kernel::mutex);
  return RunTraced(Kernel::Running(), operation, body, arguments...);
}

}  // namespace varnel_kernel
