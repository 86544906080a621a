// Calls the host's trace hook before and after each kernel call.
#pragma once

#include <cstdint>
#include <span>
#include <type_traits>

#include "varnel-kernel/Callbacks.h"
#include "varnel-kernel/VarnelKernelHost.h"

namespace varnel_kernel {

// The kVRKTrace constant for an argument of each type.
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

// Describes an argument before a call, or after one that has stored its outs (`stored`).
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
  explicit Trace(ActiveCallback*& innermostCode) : running(innermostCode) {}

  VRKHostTraceHook Hook() const noexcept { return hook; }
  void Set(VRKHostTraceHook newHook, void* newContext) noexcept {
    hook = newHook;
    context = newContext;
  }

  // Whether calls are traced. Calls that the hook makes are not.
  bool IsOn() const noexcept { return hook != nullptr && !isInHook; }

  // Announces a call. A result other than 0 replaces the call, which must then not run.
  VRKResult Enter(const char* operation, std::span<const VRKHostTraceArgument> arguments) noexcept;

  // Reports the result of the innermost announced call.
  void Leave(const char* operation, std::span<const VRKHostTraceArgument> arguments,
             VRKResult result) noexcept;

 private:
  VRKResult Tell(const VRKHostTraceCall& call) noexcept;

  ActiveCallback*& running;
  VRKHostTraceHook hook = nullptr;
  void* context = nullptr;
  uint32_t depth = 0;
  bool isInHook = false;
};

}  // namespace varnel_kernel
