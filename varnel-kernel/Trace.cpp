#include "varnel-kernel/Trace.h"

namespace varnel_kernel {

VRKResult Trace::Enter(const char* operation,
                       std::span<const VRKHostTraceArgument> arguments) noexcept {
  const auto count = static_cast<uint32_t>(arguments.size());
  return Tell({operation, arguments.data(), count, depth++, 0, kVRKNoError});
}

void Trace::Leave(const char* operation, std::span<const VRKHostTraceArgument> arguments,
                  VRKResult result) noexcept {
  const auto count = static_cast<uint32_t>(arguments.size());
  Tell({operation, arguments.data(), count, --depth, 1, result});
}

VRKResult Trace::Tell(const VRKHostTraceCall& call) noexcept {
  if (hook == nullptr) return kVRKNoError;  // removed while the call ran
  isInHook = true;
  const VRKResult result = CallOut(running, kVRKCallbackThrew, hook, &call, context);
  isInHook = false;
  return result;
}

}  // namespace varnel_kernel
