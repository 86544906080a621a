// A kernel for each test, and a look at the calls that reach it.
#pragma once

#include <gtest/gtest.h>

#include <functional>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "tests/FaultSweep.h"
#include "tests/Runtime.h"
#include "tests/wrapper-framework/Operations.h"
#include "varnel-kernel/VarnelKernelHost.h"
#include "wrapper-framework/source/DataCoercion.h"
#include "wrapper-framework/source/MessageHandler.h"
#include "wrapper-framework/source/ObjectFactory.h"
#include "wrapper-framework/source/ResultCodes.h"

// What is alive in the kernel, by kind; empty when nothing is.
std::string Alive();

// Runs a kernel, in which nothing is to be left in the end.
class KernelTest : public testing::Test {
 protected:
  KernelTest() { EXPECT_EQ(VRKHostStart(), 0u); }
  ~KernelTest() override;
};

// A call as the trace notes it: the operation, and its arguments that are numbers, tokens or
// handles, after a space each.
template <class... Arguments>
std::string Call(std::string operation, Arguments... arguments) {
  ((operation += ' ' + std::to_string(static_cast<uint32_t>(arguments))), ...);
  return operation;
}

// Notes the calls made to the kernel, from its construction on, and can make some of them fail; one
// at a time. Calls that fail and would have given something up are made good by the destructor.
class CallTrace {
 public:
  static constexpr VRKResult kFailure = 4242;
  static constexpr VRKResult kLaterFailure = 4343;  // of faults that last, from the second one on

  CallTrace();
  ~CallTrace();
  CallTrace(const CallTrace&) = delete;
  CallTrace& operator=(const CallTrace&) = delete;

  // Fails the next call of an operation, or those from now on that are a fault's. One that lasts spares
  // the ends of registrations: a kernel that goes on calling what is gone cannot be survived.
  void FailNext(std::string operation) { failNext = std::move(operation); }
  void Fail(Fault& newFault) { fault = &newFault; }

  // The operation that was made to fail first, or empty.
  const std::string& Failed() const { return failed; }

  // What was heard of is not made good: its caller has what it had.
  void Hear(VRKResult result) {
    if (result == kFailure && GivesUp(failed)) makeGood.erase(makeGood.begin());
  }

  // The calls so far, but for those that retain or release nothing; forgets them.
  std::vector<std::string> Take();

 private:
  static VRKResult VRK_CALL Hook(const VRKHostTraceCall* call, void* context);
  static std::function<void()> Again(const VRKHostTraceCall& call);
  VRKResult Note(const VRKHostTraceCall& call);
  bool Strikes(const std::string& operation);

  std::vector<std::string> calls;
  std::string failNext;
  Fault* fault = nullptr;
  std::string failed;
  std::vector<std::function<void()>> makeGood;
};

// A callback as the trace shows it.
template <class Callback>
Callback AsCallback(const void* pointer) {
  return reinterpret_cast<Callback>(reinterpret_cast<uintptr_t>(pointer));
}

// The three kinds of callback, each made of a function.

class Handler : public Varnel::MessageHandler {
 public:
  using Function = std::function<bool(VRKObject, VRKToken, const Varnel::DictionaryRef&)>;

  explicit Handler(Function handle, VRKObject attachTo = {}, bool deletesItself = false)
      : MessageHandler(attachTo, deletesItself), function(std::move(handle)) {}

  bool HandleMessage(VRKObject receiver, VRKToken message, const Varnel::DictionaryRef& parameters) override {
    return function(receiver, message, parameters);
  }
  VRKObject Object() const { return object; }
  bool IsRegistered() const { return registration != VRKMessageHandler{}; }

 private:
  Function function;
};

class Factory : public Varnel::ObjectFactory {
 public:
  using Function = std::function<void(VRKToken, const Varnel::DictionaryRef&, const Varnel::ObjectRef&)>;

  explicit Factory(Function initialize) : function(std::move(initialize)) {}
  void InitializeObject(VRKToken objectClass, const Varnel::DictionaryRef& parameters, const Varnel::ObjectRef& newObject) override {
    function(objectClass, parameters, newObject);
  }

 private:
  Function function;
};

class Coercion : public Varnel::DataCoercion {
 public:
  using Function = std::function<bool(const Varnel::DataRef&, VRKToken, VRKToken, Varnel::DataRef&)>;

  explicit Coercion(Function coerce) : function(std::move(coerce)) {}
  bool HandleCoercionImpl(const Varnel::DataRef& source, VRKToken fromType, VRKToken toType, Varnel::DataRef& result) override {
    return function(source, fromType, toType, result);
  }

 private:
  Function function;
};

// What VRKRuntimeError is told, and what it answers.
struct Report {
  static uint32_t VRK_CALL Note(uint32_t severity, const char* domain, const char* expression, const char* sourceFile, uint32_t line,
                                const char* function, uint32_t* onceFlag, void* context);

  std::string text;
  uint32_t flagToSet = 0;
  uint32_t answer = 0;
  uint32_t count = 0;
  uint32_t* flag = nullptr;  // of the latest report
};

// What a boundary would return for what `body` throws, or 0.
VRKResult CodeOf(const std::function<void()>& body);

// Whether a phase throws what fails in it: always, or unless nobody is to hear of it, or never.
enum class Hears { kAll, kSome, kNothing };

// One of the things that are done in a world, how many calls and allocations it takes at least, and what
// is alive in the kernel when it is done, and may be when it failed; what was before where nothing is said.
template <class World>
struct Phase {
  const char* name;
  void (World::*run)();
  Hears hears;
  size_t calls, allocations;
  std::string done = {};
  std::set<std::string> failed = {};
};

// What a phase may return when `failed` was the first operation to fail, or empty.
std::set<VRKResult> ResultsOf(const std::string& failed, bool lasts, Hears hears);

// Runs the phase, in a world of its own each time, with faults at the kernel's calls and at allocations.
// The world looks itself at what it made of them.
template <class World>
void SweepPhase(const Phase<World>& phase) {
  SCOPED_TRACE(phase.name);
  const auto sweep = [&phase](size_t least, const auto& runWith) {
    SweepFaults(least, [&](Fault& fault) {
      World world(phase);
      const std::string before = Alive();
      const auto [result, expected] = runWith(fault, [&] { (world.*phase.run)(); });
      EXPECT_TRUE(expected.contains(result)) << result;
      const std::set<std::string> failed = phase.failed.empty() ? std::set{before} : phase.failed;
      EXPECT_TRUE(result != 0 ? failed.contains(Alive()) : Alive() == (phase.done.empty() ? before : phase.done)) << Alive();
      world.Check(phase);
    });
  };
  sweep(phase.calls, [&](Fault& fault, const auto& body) {
    CallTrace trace;
    trace.Fail(fault);
    const VRKResult result = CodeOf(body);
    trace.Hear(result);
    return std::pair(result, ResultsOf(trace.Failed(), fault.lasts, phase.hears));
  });
  sweep(kLibrariesShareRuntime ? phase.allocations : 0, [&](Fault& fault, const auto& body) {
    VRKResult result = 0;
    {
      const AllocationMeter meter(fault);
      result = CodeOf(body);
    }
    return std::pair(result, ResultsOf(fault.hasFired ? "VRKMemoryAllocate" : "", fault.lasts, phase.hears));
  });
}
