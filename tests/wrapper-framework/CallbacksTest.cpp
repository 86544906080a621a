// Handlers, factories and coercions, and what becomes of exceptions in them.
#include <algorithm>
#include <memory>
#include <new>
#include <stdexcept>
#include <typeinfo>

#include "AllocationMeter.h"
#include "Conversion.h"
#include "Data.h"
#include "Exceptions.h"
#include "Runtime.h"
#include "Support.h"
#include "Tokens.h"

namespace {

using Varnel::DataRef;
using Varnel::DictionaryRef;
using Varnel::MakeToken;
using Varnel::ObjectRef;

ObjectRef PlainObject() {
  ObjectRef object;
  object.Create({}, {});
  return object;
}

DictionaryRef EmptyDictionary() {
  DictionaryRef dictionary;
  dictionary.Create();
  return dictionary;
}

// Two that are made of several kinds, which the order of the clauses tells apart.
struct Custom : Varnel::CustomErrorException, Varnel::Exception {
  explicit Custom(bool fails) : Exception(1), failsToDescribe(fails) {}
  void FillErrorInfo(DictionaryRef& errorInfo) const override {
    ++descriptions;
    errorInfo.SetEntry(MakeToken("custom"), Varnel::MakeUTF8Data("!", 1));
    if (failsToDescribe) throw Varnel::InvariantViolation();
  }
  bool failsToDescribe;
  static inline uint32_t descriptions = 0;
};

struct CodedOutOfRange : std::out_of_range, Varnel::ResultCodeException {
  CodedOutOfRange() : out_of_range("") {}
  uint32_t GetResultCode() const noexcept override { return 99; }
};

struct Recoded : Varnel::Exception {
  using Exception::Exception;
  uint32_t GetResultCode() const noexcept override { return 98; }
};

template <class Thrown, class... Arguments>
std::function<void()> Throw(Arguments... arguments) {
  return [=] { throw Thrown(arguments...); };
}

TEST(Exceptions, KnowTheirTextsAndCodes) {
  const auto what = [](const std::exception& error) { return std::string(error.what()); };
  EXPECT_EQ(what(Varnel::Exception(13)), "varnel.kernel.wrapperframework.exception");
  EXPECT_EQ(what(Varnel::InputContractViolation()), "An input contract violation has occured!");
  EXPECT_EQ(what(Varnel::OutputContractViolation()), "An output contract violation has occured!");
  EXPECT_EQ(what(Varnel::InvariantViolation()), "An invariant violation has occured!");
  EXPECT_EQ(what(Varnel::BadAllocation()), "bad allocation");
  const Recoded recoded(1);
  EXPECT_EQ(Varnel::Exception(recoded).GetResultCode(), 98u);
  try {
    Varnel::ThrowResultCode(13);
  } catch (const std::exception& error) {
    EXPECT_EQ(typeid(error), typeid(Varnel::Exception));
  }
}

using CallbacksTest = KernelTest;

TEST_F(CallbacksTest, TurnExceptionsIntoCodes) {
  struct {
    VRKResult code;
    std::function<void()> body;
  } const cases[] = {
      {4711, [] { Varnel::ThrowResultCode(4711); }},
      {13, Throw<Varnel::InputContractViolation>()},
      {14, Throw<Varnel::OutputContractViolation>()},
      {15, Throw<Varnel::InvariantViolation>()},
      {17, Throw<std::out_of_range>("")},
      {18, Throw<std::bad_alloc>()},
      {18, Throw<std::bad_array_new_length>()},
      {18, Throw<Varnel::BadAllocation>()},
      {20, Throw<std::domain_error>("")},
      {20, Throw<std::invalid_argument>("")},
      {20, Throw<std::length_error>("")},
      {20, Throw<std::logic_error>("")},
      {20, Throw<std::overflow_error>("")},
      {20, Throw<std::underflow_error>("")},
      {20, Throw<std::range_error>("")},
      {20, Throw<std::runtime_error>("")},
      {20, Throw<std::exception>()},
      {20, Throw<std::bad_typeid>()},
      {20, Throw<int>(7)},
      {21, Throw<std::bad_cast>()},
      {98, Throw<Recoded>(1u)},
      {99, Throw<CodedOutOfRange>()},
      {257, Throw<Custom>(false)},
      {257, Throw<Custom>(true)},
  };
  const VRKToken type = MakeToken("type:test"), word = MakeToken("word");
  const std::function<void()>* body = nullptr;
  Handler* const handler = new Handler([&body](auto&&...) { return (*body)(), true; });
  const ObjectRef object = PlainObject();
  handler->SetObject(object.Get());
  handler->AddMessages(&word, 1);
  Factory factory([&body](auto&&...) { (*body)(); });
  factory.Register(word, 0);
  Coercion coercion([&body](auto&&...) { return (*body)(), true; });
  coercion.Install(type, word);
  const DataRef data = Varnel::MakeData("type:test", "x", 1);
  for (const auto& each : cases) {
    body = &each.body;
    VRKObject made{};
    VRKData coerced{};
    const DictionaryRef parameters = EmptyDictionary();
    EXPECT_EQ(VRKObjectCreate(word, parameters.Get(), &made), each.code);
    EXPECT_EQ(VRKDataCoerce(data.Get(), word, &coerced), each.code);
    EXPECT_EQ(VRKObjectDeliverMessage(object.Get(), word, parameters.Get(), 1), each.code);
    EXPECT_EQ(parameters.CreateKeyList().GetSize(), each.code == 257 ? 1u : 0u) << each.code;
    EXPECT_EQ(VRKObjectDeliverMessage(object.Get(), word, {}, 1), each.code);
    EXPECT_EQ(std::exchange(Custom::descriptions, 0), each.code == 257 ? 1u : 0u) << each.code;
    EXPECT_EQ(made, VRKObject{});
    EXPECT_EQ(coerced, VRKData{});
  }
  delete handler;

  CallTrace trace;
  trace.FailNext("VRKDictionaryRetain");
  const DictionaryRef parameters = EmptyDictionary();
  const auto described = [&] {
    try {
      throw Custom(false);
    } catch (...) {
      return Varnel::ResultCodeFromException(parameters);
    }
  };
  EXPECT_EQ(described(), 257u);
  EXPECT_EQ(trace.Failed(), "VRKDictionaryRetain");
}

TEST_F(CallbacksTest, AnswerMessages) {
  const VRKToken taken = MakeToken("taken"), declined = MakeToken("declined");
  const ObjectRef object = PlainObject();
  const DictionaryRef parameters = EmptyDictionary();
  Handler handler(
      [&](VRKObject receiver, VRKToken message, const DictionaryRef& given) {
        EXPECT_EQ(receiver, object.Get());
        EXPECT_EQ(given.Get(), parameters.Get());
        return message == taken;
      },
      object.Get());
  const VRKToken both[] = {taken, declined};
  handler.AddMessages(both, 2);
  CallTrace trace;
  EXPECT_TRUE(Varnel::DeliverMessage(object.Get(), taken, parameters, false));
  EXPECT_FALSE(Varnel::DeliverMessage(object.Get(), declined, parameters, true));
  const auto deliver = [&](VRKToken message, uint32_t flags) {
    return Call("VRKObjectDeliverMessage", object.Get(), message, parameters.Get(), flags);
  };
  const std::string retain = Call("VRKDictionaryRetain", parameters.Get());
  const std::string release = Call("VRKDictionaryRelease", parameters.Get());
  EXPECT_EQ(trace.Take(), std::vector({deliver(taken, 1), retain, release, deliver(declined, 0), retain, release}));
  EXPECT_EQ(CodeOf([&] { Varnel::DeliverMessage({}, taken, parameters, false); }), VRKResult{kVRKInvalidHandle});
}

TEST_F(CallbacksTest, MoveFromObjectToObject) {
  const VRKToken word = MakeToken("word");
  ObjectRef first = PlainObject(), second = PlainObject();
  int calls = 0;
  Handler handler([&](auto&&...) { return ++calls, true; });
  EXPECT_EQ(CodeOf([&] { handler.AddMessages(&word, 1); }), 16u);
  EXPECT_EQ(CodeOf([&] { handler.SetObject({}); }), 13u);
  handler.SetObject(first.Get());
  handler.AddMessages(&word, 1);
  CallTrace trace;
  handler.SetObject(first.Get());
  EXPECT_TRUE(trace.Take().empty());
  trace.FailNext("VRKMessageHandlerRemove");
  EXPECT_EQ(CodeOf([&] { handler.SetObject(second.Get()); }), CallTrace::kFailure);
  EXPECT_EQ(handler.Object(), first.Get());
  EXPECT_TRUE(Varnel::DeliverMessage(first.Get(), word, EmptyDictionary(), false));
  handler.SetObject(second.Get());
  handler.AddMessages(&word, 1);
  EXPECT_FALSE(Varnel::DeliverMessage(first.Get(), word, EmptyDictionary(), false));
  EXPECT_TRUE(Varnel::DeliverMessage(second.Get(), word, EmptyDictionary(), false));
  for (const char* const step : {"VRKMessageHandlerInstall", "VRKMessageHandlerAddMessages"}) {
    trace.FailNext(step);
    EXPECT_EQ(CodeOf([&] { handler.SetObject(first.Get()); }), CallTrace::kFailure);
    EXPECT_EQ(handler.Object(), VRKObject{});
    trace.FailNext(step);
    EXPECT_EQ(CodeOf([&] { Handler(nullptr, first.Get()); }), CallTrace::kFailure);
    EXPECT_EQ(Alive(), "objects 2 ");
  }
  handler.SetObject(first.Get());
  calls = 0;
  trace.Take();
  first.Reset();
  EXPECT_EQ(calls, 1) << "the object's death";
  EXPECT_FALSE(handler.IsRegistered());
  EXPECT_EQ(trace.Take().size(), 1u) << "and no other call than the release";
}

TEST_F(CallbacksTest, MayDeleteThemselves) {
  const VRKToken word = MakeToken("word"), died = MakeToken("message:orvane.vrk.object-died");
  ObjectRef object = PlainObject();
  Handler* handler = nullptr;
  handler = new Handler([&handler](auto&&...) { return delete handler, true; }, object.Get());
  handler->AddMessages(&word, 1);
  EXPECT_TRUE(Varnel::DeliverMessage(object.Get(), word, EmptyDictionary(), false));
  EXPECT_EQ(Alive(), "objects 1 ");

  VRKResult answer = 0;
  VRKToken last{};
  const auto take = [&](VRKObject, VRKToken message, const DictionaryRef&) {
    last = message;
    if (answer != 0 && answer != 256) throw Varnel::Exception(answer);
    return answer == 0;
  };
  for (const VRKResult code : {0u, 256u, 18u, CallTrace::kFailure}) {
    answer = code;
    new Handler(take, object.Get(), true);
    EXPECT_EQ(VRKObjectDeliverMessage(object.Get(), died, {}, 1), code);
    EXPECT_EQ(last, died);
    EXPECT_EQ(Alive(), "objects 1 ");
  }
  new Handler(take, object.Get(), true);
  object.Reset();
  EXPECT_EQ(Alive(), "");

  Factory* const factory = new Factory([&factory](auto&&...) { delete factory; });
  factory->Register(word, 0);
  object.Create(word, {});
  Coercion* const coercion = new Coercion([&coercion](auto&&...) { return delete coercion, false; });
  coercion->Install(word, MakeToken("type:test"));
  DataRef target;
  EXPECT_FALSE(Varnel::MakeData("word", "x", 1).Coerce(MakeToken("type:test"), target));
  EXPECT_EQ(Alive(), "objects 1 ");
}

// Reaches the callbacks as another kernel would.
TEST_F(CallbacksTest, CheckWhatTheyAreGiven) {
  static const void *factoryCallback, *coercionCallback;
  const auto hook = [](const VRKHostTraceCall* call, void*) -> VRKResult {
    const std::string operation = call->operation;
    if (operation == "VRKObjectFactoryRegister") factoryCallback = call->arguments[2].pointer;
    if (operation == "VRKDataCoercionHandlerInstall") coercionCallback = call->arguments[3].pointer;
    return 0;
  };
  VRKHostSetTraceHook(hook, nullptr);
  const VRKToken word = MakeToken("word");
  int calls = 0;
  Factory factory([&](auto&&...) { ++calls; });
  factory.Register(word, 0);
  Coercion coercion([&](auto&&...) { return ++calls, false; });
  EXPECT_EQ(CodeOf([&] { coercion.Install({}, word); }), 13u);
  EXPECT_EQ(CodeOf([&] { coercion.Install(word, {}); }), 13u);
  coercion.Install(word, word);
  const auto create = AsCallback<VRKObjectFactoryCallback>(factoryCallback);
  const auto coerce = AsCallback<VRKDataCoercionCallback>(coercionCallback);
  VRKObject object{};
  VRKData untouched{7};
  EXPECT_EQ(create(word, {}, nullptr, &object), 13u);
  EXPECT_EQ(create(word, {}, &factory, nullptr), 13u);
  EXPECT_EQ(coerce({}, word, word, &coercion, nullptr), 13u);
  EXPECT_EQ(calls, 0);
  EXPECT_EQ(coerce({}, word, word, &coercion, &untouched), 512u);
  EXPECT_EQ(untouched, VRKData{7});
  EXPECT_EQ(create(word, {}, &factory, &object), 0u);
  ObjectRef().Adopt(object);
}

// All that a translator object goes through, from its class to its death, with a handler that
// echoes a key and a coercion on the key's way in.
class Scenario {
 public:
  Scenario() = default;
  ~Scenario() {
    if (Handler::alive != 0) delete handler;  // it was not told that it is to go
  }
  Scenario(const Scenario&) = delete;
  Scenario& operator=(const Scenario&) = delete;

  void Run() {
    const VRKToken objectClass = MakeToken("class:echo");
    const std::unique_ptr<Factory> factory(new Factory([this](auto&&... arguments) { Initialize(arguments...); }));
    factory->Register(objectClass, 0);
    const std::unique_ptr<Coercion> coercion(new Coercion([](auto&&... arguments) { return Reverse(arguments...); }));
    coercion->Install(MakeToken("type:reversed"), MakeToken(Varnel::kTypeUTF8));

    DictionaryRef parameters;
    parameters.Create();
    const DictionaryRef options = EmptyDictionary();
    options.SetEntry(MakeToken("option"), Varnel::MakeUTF8Data("x", 1));
    const VRKDictionary handle = options.Get();
    parameters.SetEntry(MakeToken("options"), Varnel::MakeData(Varnel::kTypeDictionary, &handle, sizeof handle));
    ObjectRef object;
    object.Create(objectClass, parameters.Get());
    parameters.SetEntry(MakeToken("key"), Varnel::MakeData("type:reversed", "cba", 3));
    EXPECT_TRUE(Varnel::DeliverMessage(object.Get(), MakeToken("echo"), parameters, false));
    std::vector<uint16_t> result;
    Varnel::GetUTF16LE(parameters.GetEntry(MakeToken("result")), result);
    EXPECT_EQ(result, std::vector<uint16_t>({'a', 'b', 'c'}));
    beforeDeath();
    object.Reset();
  }

  // Called when all is done but the object's death and what else is given up, of whose failures
  // nobody hears.
  std::function<void()> beforeDeath = [] {};

 private:
  void Initialize(VRKToken, const DictionaryRef& parameters, const ObjectRef& object) {
    EXPECT_EQ(Varnel::AsDictionary(parameters).elements().size(), 1u);
    std::unique_ptr<Handler> made(new Handler([](auto&&... arguments) { return Echo(arguments...); }, {}, true));
    made->SetObject(object.Get());
    const VRKToken message = MakeToken("echo");
    made->AddMessages(&message, 1);
    handler = made.release();
  }

  static bool Reverse(const DataRef& source, VRKToken, VRKToken toType, DataRef& result) {
    const Varnel::RawPayload payload = Varnel::GetRawPayload(source);
    std::string text(static_cast<const char*>(payload.bytes), payload.byteCount);
    std::reverse(text.begin(), text.end());
    return Varnel::MakeUTF8Data(text.data(), payload.byteCount).Coerce(toType, result);
  }

  static bool Echo(VRKObject, VRKToken message, const DictionaryRef& parameters) {
    if (message != MakeToken("echo")) return false;
    const std::string key = Varnel::GetUTF8(parameters.GetEntry(MakeToken("key")));
    const std::vector<uint16_t> units(key.begin(), key.end());
    const auto count = static_cast<uint32_t>(units.size());
    parameters.SetEntry(MakeToken("result"), Varnel::MakeUTF16LEData(units.data(), count));
    return true;
  }

  Handler* handler = nullptr;
};

TEST_F(CallbacksTest, PassOnEachFailureAndLeaveNothing) {
  size_t failures = 0;
  for (bool fails = true; fails; failures += fails) {
    {
      Scenario scenario;
      CallTrace trace;
      trace.FailAt(failures + 1);
      bool isUnheard = false;
      scenario.beforeDeath = [&] { isUnheard = trace.Failed().empty(); };
      const VRKResult code = CodeOf([&] { scenario.Run(); });
      const std::string& failed = trace.Failed();
      fails = !failed.empty();
      if (isUnheard) {
        EXPECT_EQ(code, 0u) << failed << ' ' << failures;
      } else if (code != 0 || !failed.ends_with("Release")) {
        EXPECT_EQ(code, failed == "VRKMemoryAllocate" ? 18 : CallTrace::kFailure) << failed << ' ' << failures;
      }
    }
    EXPECT_EQ(Alive(), "") << failures;
  }
  EXPECT_GT(failures, 150u);
}

TEST_F(CallbacksTest, LeaveNothingWhenMemoryRunsOut) {
  size_t failures = 0;
  for (bool fails = true; fails; failures += fails) {
    {
      Scenario scenario;
      VRKResult code = 0;
      {
        const AllocationMeter meter(failures + 1);
        code = CodeOf([&] { scenario.Run(); });
        fails = meter.Failed();
      }
      EXPECT_EQ(code, fails ? 18u : 0u) << failures;
    }
    EXPECT_EQ(Alive(), "") << failures;
  }
  EXPECT_GT(failures, kLibrariesShareRuntime ? 20u : 10u);
}

}  // namespace
