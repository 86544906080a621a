/* The kernel's interface used from C. */
#include "FromC.h"

#include "VarnelKernelHost.h"

static VRKResult VRK_CALL CountCall(const VRKHostTraceCall* call, void* context) {
  if (call->isFinished) ++*(uint32_t*)context;
  return kVRKNoError;
}

uint32_t CountCallsFromC(void) {
  uint32_t calls = 0;
  VRKToken type = 0;
  VRKData data = 0;
  VRKHostSetTraceHook(CountCall, &calls);
  VRKTokenCreate("type:orvane.vrk.utf8", 0, &type);
  VRKDataCreate(type, "text", 4, 0, &data);
  VRKDataRelease(data);
  VRKHostSetTraceHook(0, 0);
  return calls;
}
