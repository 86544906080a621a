// The one kernel of the process, and the entry path of every call: lock, state, trace, error guard.
#pragma once

#include <array>
#include <mutex>
#include <new>
#include <stdexcept>

#include "varnel-kernel/Callbacks.h"
#include "varnel-kernel/Coercions.h"
#include "varnel-kernel/ErrorReports.h"
#include "varnel-kernel/HandleTable.h"
#include "varnel-kernel/Objects.h"
#include "varnel-kernel/PlugIns.h"
#include "varnel-kernel/TokenTable.h"
#include "varnel-kernel/Trace.h"
#include "varnel-kernel/Values.h"
#include "varnel-kernel/VarnelKernelHost.h"

namespace varnel_kernel {

// Owns the kernel's parts, each of which uses only those declared before it. A shut-down keeps
// tokens and the generations of handles, because code that is still loaded may hold either.
class Kernel {
 public:
  // Creates the kernel on the first call. It is never destroyed, because libraries may call it
  // until the process ends.
  static VRKResult Start();

  VRKResult ShutDown(VRKHostLiveCounts* outLive) noexcept;
  VRKHostLiveCounts LiveCounts() const noexcept;

  // Guards everything below.
  static inline std::recursive_mutex mutex;
  static inline Kernel* built = nullptr;

  static Kernel* Running() noexcept {
    return built != nullptr && built->isRunning ? built : nullptr;
  }

  ActiveCallback* innermostCode = nullptr;
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

// Turns exceptions into result codes. The kernel itself throws only when memory runs out.
template <class Body>
VRKResult CatchAll(Body body) noexcept {
  try {
    return body();
  } catch (const std::bad_alloc&) {
    return kVRKOutOfMemory;
  } catch (const std::length_error&) {  // a vector beyond the address space
    return kVRKOutOfMemory;
  }
}

template <class Body, class... Arguments>
VRKResult Traced(Trace& trace, const char* operation, Body body, Arguments... arguments) {
  const std::array before{Describe(arguments, false)...};
  VRKResult result = trace.Enter(operation, before);
  if (result == kVRKNoError) result = body();
  // The address of a block that the call freed is shown, not read.
  // NOLINTNEXTLINE(clang-analyzer-unix.Malloc)
  const std::array after{Describe(arguments, result == kVRKNoError)...};
  trace.Leave(operation, after, result);
  return result;
}

// Runs `body` with a kernel, which may be null, and traces the call. Requires the kernel's lock.
template <class Body, class... Arguments>
VRKResult RunTraced(Kernel* kernel, const char* operation, Body body,
                    Arguments... arguments) noexcept {
  if (kernel == nullptr) return kVRKNotRunning;
  const auto run = [&] { return CatchAll([&] { return body(*kernel); }); };
  return kernel->trace.IsOn() ? Traced(kernel->trace, operation, run, arguments...) : run();
}

// Serves one call: locks the kernel, traces the call, runs `body` with the running kernel.
template <class Body, class... Arguments>
VRKResult Serve(const char* operation, Body body, Arguments... arguments) noexcept {
  const std::lock_guard lock(Kernel::mutex);
  return RunTraced(Kernel::Running(), operation, body, arguments...);
}

}  // namespace varnel_kernel
