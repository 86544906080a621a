// What a host's trace hook is told of a call.
#pragma once

#include <cstdint>
#include <span>
#include <type_traits>

#include "Callbacks.h"
#include "VarnelKernelHost.h"

namespace varnel_kernel {

// How the trace names an argument of each type.
template <class Argument>
constexpr uint32_t kTraceKind = kVRKTracePointer;
template <>
inline constexpr uint32_t kTraceKind<uint32_t> = kVRKTraceNumber;
template <>
inline constexpr uint32_t kTraceKind<const char*> = kVRKTraceText;
template <>
inline constexpr uint32_t kTraceKind<VRKObject> = kVRKTraceObject;
template <>
inline constexpr uint32_t kTraceKind<VRKMessageHandler> = kVRKTraceHandler;
template <>
inline constexpr uint32_t kTraceKind<VRKToken> = kVRKTraceToken;
template <>
inline constexpr uint32_t kTraceKind<VRKData> = kVRKTraceData;
template <>
inline constexpr uint32_t kTraceKind<VRKList> = kVRKTraceList;
template <>
inline constexpr uint32_t kTraceKind<VRKDictionary> = kVRKTraceDictionary;

// An argument as it stands before the call or, when `stored`, after one that stored its outs.
template <class Argument>
VRKHostTraceArgument Describe(Argument argument, bool stored) noexcept {
  if constexpr (!std::is_pointer_v<Argument>) {
    return {kTraceKind<Argument>, 0, static_cast<uint32_t>(argument), nullptr};
  } else {
    using Pointed = std::remove_pointer_t<Argument>;
    const auto* const pointer = reinterpret_cast<const void*>(argument);
    constexpr bool kHoldsNumber =
        kTraceKind<Pointed> != kVRKTracePointer && kTraceKind<Pointed> != kVRKTraceText;
    if constexpr (std::is_pointer_v<Pointed>) {
      const void* const kept = stored && argument != nullptr ? *argument : nullptr;
      return {kVRKTracePointer, 1, 0, kept};
    } else if constexpr (kHoldsNumber) {
      const uint32_t number = stored && argument != nullptr ? static_cast<uint32_t>(*argument) : 0;
      return {kTraceKind<Pointed>, 1, number, pointer};
    } else {
      return {kTraceKind<Argument>, 0, 0, pointer};
    }
  }
}

class Trace {
 public:
  explicit Trace(RunningCode*& innermostCode) : running(innermostCode) {}

  VRKHostTraceHook Hook() const noexcept { return hook; }
  void Set(VRKHostTraceHook newHook, void* newContext) noexcept {
    hook = newHook;
    context = newContext;
  }

  // Whether calls are to be traced now; not while the hook runs.
  bool IsOn() const noexcept { return hook != nullptr && !isInHook; }

  // Tells of a call that is about to run. A result other than 0 is to become the call's.
  VRKResult Enter(const char* operation, std::span<const VRKHostTraceArgument> arguments) noexcept;

  // Tells how the call ended that was entered last.
  void Leave(const char* operation, std::span<const VRKHostTraceArgument> arguments,
             VRKResult result) noexcept;

 private:
  VRKResult Tell(const VRKHostTraceCall& call) noexcept;

  RunningCode*& running;
  VRKHostTraceHook hook = nullptr;
  void* context = nullptr;
  uint32_t depth = 0;
  bool isInHook = false;
};

}  // namespace varnel_kernel
