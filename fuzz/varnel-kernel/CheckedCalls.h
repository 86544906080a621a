// Calls of the kernel, with good arguments and bad ones, and what the model says of each of them.
#pragma once

#include <algorithm>
#include <array>
#include <functional>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "fuzz/Choices.h"
#include "fuzz/Input.h"
#include "fuzz/varnel-kernel/KernelModel.h"
#include "tests/AllocationMeter.h"
#include "tests/Runtime.h"

// A handle that is passed, good or bad.
struct Argument {
  Kind kind;
  Handle handle;
  bool mayBeNull = false;

  template <class Typed>
  operator Typed() const {
    return Typed{handle};
  }
};

// A pointer that must not be null.
template <class Pointer>
struct Needed {
  Pointer pointer;
  bool IsLacking() const { return pointer == nullptr; }
  operator Pointer() const { return pointer; }
};

// What a call stores something in, or null.
template <class Value>
struct Out {
  Out(bool given, bool needed = true) : isGiven(given), isNeeded(needed) {}

  bool IsLacking() const { return isNeeded && !isGiven; }
  bool IsUntouched() const { return value == Out(true).value; }
  operator Value*() { return isGiven ? &value : nullptr; }

  Value value = (Value)(uintptr_t)0xDEADBEEF;
  bool isGiven;
  bool isNeeded;
};

// What a callback is given: its context, and handles, numbers and pointers in their order.
struct Told {
  uintptr_t context;
  std::array<uintptr_t, 7> values;
};

// A call that runs. Besides what its arguments tell: why it is refused, or what it does in the
// model before; which callback comes next, and what the latest answered and made; what it returns,
// after it has done the rest in the model.
struct Call {
  std::function<VRKResult()> begin = [] { return kVRKNoError; };
  std::function<Told(const Told&)> next = {};
  std::function<VRKResult()> finish = [] { return kVRKNoError; };
  VRKResult answer = kVRKNoError;
  Handle made = 0;
  bool needsKernel = true;
  bool lacksPointer = false;

  // For those who check it:
  std::string operation = {};
  std::vector<Argument> arguments = {};
  std::vector<VRKResult> refusals = {};  // of which it returns one, if there are any
  size_t failAt = 0;                     // the allocation that fails
  bool hasFailed = false;
  bool isTraced = false;
  uint32_t heard = 0;  // how often the trace hook did
  VRKResult told = 0;
};

// An operation and its name.
#define OPERATION(function) #function, function

class CheckedCalls {
 public:
  explicit CheckedCalls(Choices& decisions) : choices(decisions) { current = this; }
  virtual ~CheckedCalls() = default;
  CheckedCalls(const CheckedCalls&) = delete;
  CheckedCalls& operator=(const CheckedCalls&) = delete;

 protected:
  virtual void Step() = 0;

  // Decisions: never the rare one where the input has ended.
  uint32_t Below(uint32_t count) { return choices.Below(count); }
  bool OneIn(uint32_t count) { return Below(count) == count - 1; }
  Argument Pick(Kind kind, bool mayBeNull = false);
  Argument PickToken(uint32_t first, uint32_t count);
  bool IsGood(const Argument& argument) const;
  template <class Value>
  Out<Value> MakeOut() {
    return {!OneIn(32)};
  }
  template <class Pointer>
  Needed<Pointer> Mostly(Pointer pointer) {
    return {OneIn(32) ? nullptr : pointer};
  }

  // Makes the call, checks what comes of it, and returns whether it succeeded.
  template <class Function, class... Given>
  bool Run(Call& call, const char* operation, Function function, Given&&... given) {
    (Note(call, given), ...);
    call.operation = operation;
    Enter(call);
    const VRKResult result = function(given...);
    Leave(call, result);
    Require(result == 0 || (IsUntouched(given) && ...), "a failure stores nothing");
    return result == 0;
  }
  template <class Function, class... Given>
  bool Run(const char* operation, Function function, Given&&... given) {
    Call call;
    return Run(call, operation, function, given...);
  }

  // A callback: checks what it was given, goes on with the walk, stores what it makes, and answers,
  // or throws that it threw.
  static VRKResult Serve(const Told& told, Kind makes = Kind::kToken, void* out = nullptr);
  static VRKResult VRK_CALL OnTrace(const VRKHostTraceCall* told, void* context);

  static inline CheckedCalls* current = nullptr;
  Choices& choices;
  KernelModel model;
  std::vector<Call*> calls;  // the innermost last
  size_t failAt = 0;         // in the next call
  int depth = 0;             // of callbacks
  uintptr_t hook = 0;        // the trace hook's context; 0 for none
  bool isReading = false;    // what the hook need not look at

 private:
  template <class Given>
  static void Note(Call& call, const Given& given) {
    if constexpr (requires { given.mayBeNull; }) call.arguments.push_back(given);
    if constexpr (requires { given.IsLacking(); }) call.lacksPointer |= given.IsLacking();
  }
  template <class Given>
  static bool IsUntouched(const Given& given) {
    if constexpr (requires { given.IsUntouched(); }) return given.IsUntouched();
    return true;
  }

  Handle Odd();
  void Enter(Call& call);
  void Begin();
  void Disarm();
  void Leave(Call& call, VRKResult result);
  void Reenter();
  VRKResult Answer(VRKResult usual);

  std::optional<AllocationMeter> meter;
  bool isInHook = false;
};
