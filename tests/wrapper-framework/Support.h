// A kernel for each test, and a look at the calls that reach it.
#pragma once

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <utility>
#include <vector>

#include "DataCoercion.h"
#include "MessageHandler.h"
#include "ObjectFactory.h"
#include "VarnelKernelHost.h"

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

// Notes the calls made to the kernel, from its construction on, and can make one of them fail; one
// at a time. A call that fails and would have given something up is made good by the destructor.
class CallTrace {
 public:
  static constexpr VRKResult kFailure = 4242;

  CallTrace();
  ~CallTrace();
  CallTrace(const CallTrace&) = delete;
  CallTrace& operator=(const CallTrace&) = delete;

  // Fails the nth call from now on (from 1), or the next one of an operation.
  void FailAt(size_t n) { failAt = calls.size() + n; }
  void FailNext(std::string operation) { failNext = std::move(operation); }

  // Whether an operation gives up what the caller has.
  static bool GivesUp(const std::string& operation) {
    const auto endsWith = [&](const char* end) { return operation.ends_with(end); };
    return endsWith("Release") || endsWith("Deallocate") || endsWith("Remove") || endsWith("Unregister");
  }

  // The operation that was made to fail, or empty.
  const std::string& Failed() const { return failed; }

  // The calls so far, but for those that retain or release nothing; forgets them.
  std::vector<std::string> Take();

 private:
  static VRKResult VRK_CALL Hook(const VRKHostTraceCall* call, void* context);
  static std::function<void()> Again(const VRKHostTraceCall& call);
  VRKResult Note(const VRKHostTraceCall& call);

  std::vector<std::string> calls;
  size_t failAt = 0;
  std::string failNext;
  std::string failed;
  std::function<void()> makeGood;
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
      : MessageHandler(attachTo, deletesItself), function(std::move(handle)) {
    ++alive;
  }
  ~Handler() override { --alive; }

  bool HandleMessage(VRKObject receiver, VRKToken message, const Varnel::DictionaryRef& parameters) override {
    return function(receiver, message, parameters);
  }
  VRKObject Object() const { return object; }
  bool IsRegistered() const { return registration != VRKMessageHandler{}; }

  static inline int alive = 0;

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
