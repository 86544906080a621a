// Calls of the kernel, with good arguments and bad ones, and what the model says of each of them.
#pragma once

#include <algorithm>
#include <array>
#include <functional>
#include <optional>
#include <set>
#include <string>
#include <utility>
#include <variant>
#include <vector>

#include "AllocationMeter.h"
#include "Choices.h"
#include "Input.h"
#include "KernelModel.h"
#include "Runtime.h"

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
  operator Pointer() const { return pointer; }
};

// What a call stores something in, or null.
template <class Value>
struct Out {
  Out(bool given, bool needed = true) : isGiven(given), isNeeded(needed) {}

  static Value Untouched() {
    if constexpr (std::is_pointer_v<Value>)
      return reinterpret_cast<Value>(0xDEADBEEF);
    else
      return Value{0xDEADBEEF};
  }
  operator Value*() { return isGiven ? &value : nullptr; }

  Value value = Untouched();
  bool isGiven;
  bool isNeeded;
};

struct Creation {
  Argument objectClass;
  Argument parameters;
  uintptr_t factory = 0;
  bool isCalled = false;
  Handle temporary = 0;  // parameters where none are given
  VRKResult result = kVRKNoError;
  Handle stored = 0;
};

struct Conversion {
  Argument data;
  Argument to;
  Item source = {};
  Registrations left = {};
  VRKResult result = kVRKCannotCoerce;
  Handle stored = 0;
};

struct Report {
  uint32_t line;
  uint32_t* onceFlag;
  bool isDue = false;
  uint32_t answer = 0;
};

// A call that runs: what it calls back for, and besides what its arguments tell why it is refused,
// or what it does in the model before and after.
struct Call {
  const char* operation = nullptr;  // null for one that is not traced
  std::function<VRKResult()> begin = {};
  std::variant<std::monostate, Delivery*, Creation*, Conversion*, Report*> service = {};
  std::function<VRKResult()> finish = {};
  bool needsKernel = true;

  std::vector<Argument> arguments = {};
  bool lacksPointer = false;
  size_t failAt = 0;               // the allocation that fails
  std::set<VRKResult> codes = {};  // of which it returns one; 0 where there are none
  bool isTraced = false;
  bool isEntered = false;
  bool isLeft = false;
  bool hasFailed = false;
  VRKResult told = 0;
};

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
  Handle Odd();
  Argument Pick(Kind kind, bool mayBeNull = false);
  Argument PickToken(uint32_t first, uint32_t count);
  bool IsGood(const Argument& argument) const;
  template <class Value>
  Out<Value> MakeOut() {
    return {!OneIn(32)};
  }

  // Makes the call, checks what comes of it, and returns whether it succeeded.
  template <class Function, class... Given>
  bool Run(Call call, Function function, Given&&... given) {
    (Note(call, given), ...);
    Enter(call);
    const VRKResult result = function(given...);
    Leave(call, result);
    Require(result == 0 || (IsUntouched(given) && ...), "a failure stores nothing");
    return result == 0;
  }

  // Within a callback.
  template <class Served>
  static Served& Serving() {
    current->Disarm();
    Call& call = *current->calls.back();
    Served** const served = std::get_if<Served*>(&call.service);
    Require(served != nullptr && call.codes.empty(), "there is a reason to call");
    return **served;
  }
  void Reenter();
  VRKResult Answer(VRKResult usual);
  // Throws instead of returning that it threw.
  static VRKResult Returned(VRKResult result) {
    if (kLibrariesShareRuntime && result == kVRKCallbackThrew) throw result;
    return result;
  }
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
  template <class Other>
  static void Note(Call&, const Other&) {}
  static void Note(Call& call, const Argument& given) { call.arguments.push_back(given); }
  template <class Pointer>
  static void Note(Call& call, const Needed<Pointer>& given) {
    call.lacksPointer |= given.pointer == nullptr;
  }
  template <class Value>
  static void Note(Call& call, const Out<Value>& given) {
    call.lacksPointer |= given.isNeeded && !given.isGiven;
  }
  template <class Other>
  static bool IsUntouched(const Other&) {
    return true;
  }
  template <class Value>
  static bool IsUntouched(const Out<Value>& out) {
    return out.value == out.Untouched();
  }

  std::set<VRKResult> RefusalsOf(const Call& call) const;
  void Enter(Call& call);
  void Begin();
  void Disarm();
  void Leave(Call& call, VRKResult result);
  VRKResult HearOfStart(Call& call);

  std::optional<AllocationMeter> meter;
  bool isInHook = false;
};
