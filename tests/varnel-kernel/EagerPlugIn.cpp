// A plug-in whose constructor calls the kernel: creates a token after a pause, and sets a trace
// hook and a reporter.
#include <chrono>
#include <thread>

#include "varnel-kernel/VarnelKernelHost.h"

#if defined(_WIN32)
#define EXPORTED extern "C" __declspec(dllexport)
#else
#define EXPORTED extern "C" __attribute__((visibility("default")))
#endif

namespace {

VRKResult VRK_CALL Ignore(const VRKHostTraceCall*, void*) {
  return kVRKNoError;
}

uint32_t VRK_CALL IgnoreError(uint32_t, const char*, const char*, const char*, uint32_t, const char*, uint32_t*, void*) {
  return 0;
}

const struct Eager {
  Eager() {
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    VRKToken token{};
    VRKTokenCreate("token:test.eager", 1, &token);
    VRKHostSetTraceHook(Ignore, nullptr);
    VRKHostSetErrorReporter(IgnoreError, nullptr);
  }
} gEager;

}  // namespace

EXPORTED VRKResult VRK_CALL EagerInitialize(uint32_t) {
  return kVRKNoError;
}

EXPORTED VRKResult VRK_CALL EagerTerminate(uint32_t) {
  return kVRKNoError;
}

EXPORTED uint32_t VRK_CALL EagerVersion() {
  return 1;
}
