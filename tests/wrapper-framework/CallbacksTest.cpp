// Handlers, factories and coercions, and what becomes of exceptions in them.
#include <algorithm>
#include <memory>
#include <new>
#include <stdexcept>
#include <typeinfo>

#include "Conversion.h"
#include "Data.h"
#include "Exceptions.h"
#include "ResultCodes.h"
#include "Support.h"
#include "Tokens.h"

namespace {

using Varnel::DataRef;
using Varnel::DictionaryRef;
using Varnel::ListRef;
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
}

TEST_F(CallbacksTest, AnswerMessages) {
  const VRKToken both[] = {MakeToken("taken"), MakeToken("declined")};
  const ObjectRef object = PlainObject();
  const DictionaryRef parameters = EmptyDictionary();
  const auto take = [&](VRKObject receiver, VRKToken message, const DictionaryRef& given) {
    EXPECT_EQ(receiver, object.Get());
    EXPECT_EQ(given.Get(), parameters.Get());
    return message == both[0];
  };
  Handler handler(take, object.Get());
  handler.AddMessages(both, 2);
  CallTrace trace;
  EXPECT_TRUE(Varnel::DeliverMessage(object.Get(), both[0], parameters, false));
  EXPECT_EQ(trace.Take().front(), Call("VRKObjectDeliverMessage", object.Get(), both[0], parameters.Get(), 1));
  EXPECT_FALSE(Varnel::DeliverMessage(object.Get(), both[1], parameters, true));
  EXPECT_EQ(trace.Take().front(), Call("VRKObjectDeliverMessage", object.Get(), both[1], parameters.Get(), 0));
}

TEST_F(CallbacksTest, MoveFromObjectToObject) {
  const VRKToken word = MakeToken("word");
  ObjectRef first = PlainObject();
  const ObjectRef second = PlainObject();
  int calls = 0;
  Handler handler([&](auto&&...) { return ++calls, true; });
  EXPECT_EQ(CodeOf([&] { handler.AddMessages(&word, 1); }), 16u);
  EXPECT_EQ(CodeOf([&] { handler.SetObject({}); }), 13u);
  for (const ObjectRef& object : {second, first}) {
    handler.SetObject(object.Get());
    handler.AddMessages(&word, 1);
    EXPECT_TRUE(Varnel::DeliverMessage(object.Get(), word, EmptyDictionary(), false));
  }
  EXPECT_FALSE(Varnel::DeliverMessage(second.Get(), word, EmptyDictionary(), false));
  CallTrace trace;
  handler.SetObject(first.Get());
  EXPECT_TRUE(trace.Take().empty());
  first.Reset();
  EXPECT_EQ(calls, 3) << "with the object's death";
  EXPECT_FALSE(handler.IsRegistered());
  EXPECT_EQ(trace.Take().size(), 1u) << "the release, and no other call";
}

TEST_F(CallbacksTest, MayDeleteThemselvesWithTheirObjects) {
  const VRKToken died = MakeToken("message:orvane.vrk.object-died");
  ObjectRef object = PlainObject();
  VRKResult answer = 0;
  const auto take = [&](VRKObject, VRKToken message, const DictionaryRef&) {
    EXPECT_EQ(message, died);
    if (answer != 0 && answer != 256) throw Varnel::Exception(answer);
    return answer == 0;
  };
  for (const VRKResult code : {0u, 256u, 18u, CallTrace::kFailure}) {
    answer = code;
    new Handler(take, object.Get(), true);
    EXPECT_EQ(VRKObjectDeliverMessage(object.Get(), died, {}, 1), code);
    EXPECT_EQ(Alive(), "objects 1 ");
  }
  answer = 0;
  new Handler(take, object.Get(), true);
  object.Reset();
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

// An object with an echo, a class of such objects, a coercion on the echo's way in, and a handler that
// moves about.
class Echoes {
 public:
  explicit Echoes(const Phase<Echoes>&) {
    SetUp();
    object.Create(MakeToken("class:echo"), {});
    other = PlainObject();
    mover = std::make_unique<Handler>([](auto&&...) { return false; });
    mover->SetObject(object.Get());
  }

  void SetUp() {
    std::unique_ptr<Factory> newFactory(new Factory([](VRKToken, const DictionaryRef&, const ObjectRef& made) {
      std::unique_ptr<Handler> handler(new Handler([](auto&&... arguments) { return Echo(arguments...); }, {}, true));
      handler->SetObject(made.Get());
      const VRKToken messages[] = {MakeToken("echo"), MakeToken("fail")};
      handler->AddMessages(messages, 2);
      static_cast<void>(handler.release());
    }));
    newFactory->Register(MakeToken("class:echo"), 0);
    std::unique_ptr<Coercion> newCoercion(new Coercion([](auto&&... arguments) { return Reverse(arguments...); }));
    newCoercion->Install(MakeToken("type:reversed"), MakeToken(Varnel::kTypeUTF8));
    std::swap(factory, newFactory);
    std::swap(coercion, newCoercion);
  }
  void Create() { created.Create(MakeToken("class:echo"), {}); }
  void Send() {
    const DictionaryRef parameters = EmptyDictionary();
    parameters.SetEntry(MakeToken("key"), Varnel::MakeData("type:reversed", "cba", 3));
    EXPECT_TRUE(Varnel::DeliverMessage(object.Get(), MakeToken("echo"), parameters, false));
    std::vector<uint16_t> result;
    Varnel::GetUTF16LE(parameters.GetEntry(MakeToken("result")), result);
    EXPECT_EQ(result, std::vector<uint16_t>({'a', 'b', 'c'}));
  }
  // An error counts whether it can describe itself or not.
  void Fail() {
    const VRKResult result = VRKObjectDeliverMessage(object.Get(), MakeToken("fail"), EmptyDictionary().Get(), 1);
    if (result != Varnel::kResultCustomError) Varnel::ThrowResultCode(result);
  }
  void Move() {
    for (const ObjectRef& to : {other, object}) {
      mover->SetObject(to.Get());
      const VRKToken word = MakeToken("word");
      mover->AddMessages(&word, 1);
    }
  }
  void Construct() { Handler(nullptr, object.Get()); }
  void Convert() {
    const DictionaryRef inner = EmptyDictionary(), outer = EmptyDictionary();
    inner.SetEntry(MakeToken("a"), Varnel::MakeUTF8Data("x", 1));
    inner.SetEntry(MakeToken("b"), Varnel::MakeData(Varnel::kTypeBool, "\1", 1));
    const VRKDictionary dictionary = inner.Get();
    outer.SetEntry(MakeToken("inner"), Varnel::MakeData(Varnel::kTypeDictionary, &dictionary, sizeof dictionary));
    const VRKList list = inner.CreateKeyList().Detach();
    ListRef held;
    held.Adopt(list);
    outer.SetEntry(MakeToken("list"), Varnel::MakeData(Varnel::kTypeList, &list, sizeof list));
    const double number = 1.5;
    outer.SetEntry(MakeToken("number"), Varnel::MakeData(Varnel::kTypeDouble, &number, sizeof number));
    const orvane::dictionary_t value = Varnel::AsDictionary(outer);
    EXPECT_EQ(value.elements().size(), 3u);
    EXPECT_TRUE(Varnel::AsDictionary(outer) == value);
    EXPECT_EQ(Varnel::AsArray(held).elements().size(), 2u);
  }
  // A report that does not get through leaves what was checked as it is.
  void Report() { EXPECT_EQ(Varnel::ExtractData<uint16_t>(Varnel::MakeData("type:test", "\1\2\3", 3)), 0x0201); }
  void DeleteThemselves() {
    const VRKToken word = MakeToken("word"), test = MakeToken("type:test");
    std::unique_ptr<Handler> handler;
    handler.reset(new Handler([&handler](auto&&...) { return handler.reset(), true; }, object.Get()));
    handler->AddMessages(&word, 1);
    EXPECT_TRUE(Varnel::DeliverMessage(object.Get(), word, EmptyDictionary(), false));
    std::unique_ptr<Factory> own;
    own.reset(new Factory([&own](auto&&...) { own.reset(); }));
    own->Register(word, 0);
    ObjectRef().Create(word, {});
    std::unique_ptr<Coercion> once;
    once.reset(new Coercion([&once](auto&&...) { return once.reset(), false; }));
    once->Install(word, test);
    DataRef target;
    EXPECT_FALSE(Varnel::MakeData("word", "x", 1).Coerce(test, target));
  }
  void Die() { object.Reset(); }
  void End() {
    mover.reset();
    factory.reset();
    coercion.reset();
  }

  void Check(const Phase<Echoes>& phase) {
    if (phase.run == &Echoes::Move) {
      EXPECT_EQ(mover->IsRegistered(), Alive().find("handlers 2") != std::string::npos);
      EXPECT_EQ(mover->IsRegistered(), mover->Object() != VRKObject{});
    }
    if (object && coercion) Send();
    EXPECT_EQ(CodeOf([&] { (this->*phase.run)(); }), 0u);
    SetUp();
    object.Create(MakeToken("class:echo"), {});
    Send();
    if (mover != nullptr) Move();
    Die();
    other.Reset();
    created.Reset();
    End();
    EXPECT_EQ(Alive(), "");
  }

 private:
  static bool Reverse(const DataRef& source, VRKToken, VRKToken toType, DataRef& result) {
    const Varnel::RawPayload payload = Varnel::GetRawPayload(source);
    std::string text(static_cast<const char*>(payload.bytes), payload.byteCount);
    std::reverse(text.begin(), text.end());
    return Varnel::MakeUTF8Data(text.data(), payload.byteCount).Coerce(toType, result);
  }

  static bool Echo(VRKObject, VRKToken message, const DictionaryRef& parameters) {
    static Varnel::StaticToken fail{"fail"};
    fail.token = {};
    if (message == fail.Get()) throw Custom(false);
    if (message != MakeToken("echo")) return false;
    const std::string key = Varnel::GetUTF8(parameters.GetEntry(MakeToken("key")));
    const std::vector<uint16_t> units(key.begin(), key.end());
    parameters.SetEntry(MakeToken("result"), Varnel::MakeUTF16LEData(units.data(), static_cast<uint32_t>(units.size())));
    return true;
  }

  std::unique_ptr<Factory> factory;
  std::unique_ptr<Coercion> coercion;
  std::unique_ptr<Handler> mover;
  ObjectRef object, other, created;
};

TEST_F(CallbacksTest, SurviveEveryFault) {
  using E = Echoes;
  VRKHostSetErrorReporter([](auto...) -> uint32_t { return 0; }, nullptr);  // which allocates nothing
  const Phase<E> phases[] = {
      {"set up", &E::SetUp, Hears::kAll, 9, 0},
      {"create", &E::Create, Hears::kAll, 14, 6, "objects 3 handlers 3 factories 1 coercions 1 blocks 5 "},
      {"send", &E::Send, Hears::kAll, 51, 8},
      {"fail", &E::Fail, Hears::kSome, 16, 3},
      {"move",
       &E::Move,
       Hears::kAll,
       12,
       6,
       {},
       {"objects 2 handlers 2 factories 1 coercions 1 blocks 4 ", "objects 2 handlers 1 factories 1 coercions 1 blocks 4 "}},
      {"construct", &E::Construct, Hears::kAll, 2, 3},
      {"convert", &E::Convert, Hears::kAll, 500, 90},
      {"report", &E::Report, Hears::kSome, 8, 1},
      {"delete themselves", &E::DeleteThemselves, Hears::kAll, 36, 8},
      {"die", &E::Die, Hears::kNothing, 2, 0, "objects 1 factories 1 coercions 1 blocks 3 "},
      {"end", &E::End, Hears::kNothing, 3, 0, "objects 2 handlers 1 blocks 1 "}};
  for (const auto& phase : phases) SweepPhase(phase);
}

}  // namespace
