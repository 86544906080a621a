// Handlers, factories and coercions, and what becomes of exceptions in them.
#include <memory>
#include <new>
#include <stdexcept>
#include <typeinfo>

#include "tests/wrapper-framework/Support.h"
#include "wrapper-framework/source/Conversion.h"
#include "wrapper-framework/source/Data.h"
#include "wrapper-framework/source/Exceptions.h"
#include "wrapper-framework/source/ResultCodes.h"
#include "wrapper-framework/source/Tokens.h"

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

// Those that are made of several kinds, which the order of the clauses tells apart.
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

struct LongAndOutOfRange : std::length_error, std::out_of_range {
  LongAndOutOfRange() : length_error(""), out_of_range("") {}
};

struct Recoded : Varnel::Exception {
  using Exception::Exception;
  uint32_t GetResultCode() const noexcept override { return 98; }
};

template <class... Thrown>
std::vector<std::function<void()>> Throw(auto... arguments) {
  return {[=] { throw Thrown(arguments...); }...};
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
}

using CallbacksTest = KernelTest;

TEST_F(CallbacksTest, TurnExceptionsIntoCodes) {
  const struct {
    VRKResult code;
    std::vector<std::function<void()>> bodies;
  } cases[] = {{4711, {[] { Varnel::ThrowResultCode(4711); }}},
               {13, Throw<Varnel::InputContractViolation>()},
               {14, Throw<Varnel::OutputContractViolation>()},
               {15, Throw<Varnel::InvariantViolation>()},
               {17, Throw<std::out_of_range>("")},
               {18, Throw<std::bad_alloc, std::bad_array_new_length, Varnel::BadAllocation>()},
               {20, Throw<std::domain_error, std::invalid_argument, std::length_error, std::logic_error>("")},
               {20, Throw<std::overflow_error, std::underflow_error, std::range_error, std::runtime_error>("")},
               {20, Throw<std::exception, std::bad_typeid, int, LongAndOutOfRange>()},
               {21, Throw<std::bad_cast>()},
               {98, Throw<Recoded>(1u)},
               {99, Throw<CodedOutOfRange>()},
               {257, Throw<Custom>(false)},
               {257, Throw<Custom>(true)}};
  const VRKToken type = MakeToken("type:test"), word = MakeToken("word");
  const ObjectRef object = PlainObject();
  const std::function<void()>* body = nullptr;
  Handler handler([&body](auto&&...) { return (*body)(), true; }, object.Get());
  handler.AddMessages(&word, 1);
  Factory factory([&body](auto&&...) { (*body)(); });
  factory.Register(word, 0);
  Coercion coercion([&body](auto&&...) { return (*body)(), true; });
  coercion.Install(type, word);
  const DataRef data = Varnel::MakeData("type:test", "x", 1);
  for (const auto& [code, bodies] : cases) {
    for (const auto& each : bodies) {
      body = &each;
      VRKObject made{};
      VRKData coerced{};
      const DictionaryRef parameters = EmptyDictionary();
      EXPECT_EQ(VRKObjectCreate(word, parameters.Get(), &made), code);
      EXPECT_EQ(VRKDataCoerce(data.Get(), word, &coerced), code);
      EXPECT_EQ(VRKObjectDeliverMessage(object.Get(), word, parameters.Get(), 1), code);
      EXPECT_EQ(parameters.CreateKeyList().GetSize(), code == 257 ? 1u : 0u) << code;
      EXPECT_EQ(VRKObjectDeliverMessage(object.Get(), word, {}, 1), code);
      EXPECT_EQ(std::exchange(Custom::descriptions, 0), code == 257 ? 1u : 0u) << code;
      EXPECT_EQ(made, VRKObject{});
      EXPECT_EQ(coerced, VRKData{});
    }
  }
}

TEST_F(CallbacksTest, AnswerMessagesOfTheObjectTheyMovedTo) {
  const VRKToken both[] = {MakeToken("taken"), MakeToken("declined")};
  ObjectRef first = PlainObject();
  const ObjectRef second = PlainObject();
  const DictionaryRef parameters = EmptyDictionary();
  int calls = 0;
  Handler handler([&](VRKObject receiver, VRKToken message, const DictionaryRef& given) {
    ++calls;
    EXPECT_EQ(receiver, handler.Object());
    EXPECT_TRUE(message == MakeToken("message:orvane.vrk.object-died") || given.Get() == parameters.Get());
    return message == both[0];
  });
  EXPECT_EQ(CodeOf([&] { handler.AddMessages(both, 2); }), 16u);
  EXPECT_EQ(CodeOf([&] { handler.SetObject({}); }), 13u);
  CallTrace trace;
  for (const VRKObject object : {second.Get(), first.Get()}) {
    handler.SetObject(object);
    handler.AddMessages(both, 2);
    trace.Take();
    EXPECT_TRUE(Varnel::DeliverMessage(object, both[0], parameters, false));
    EXPECT_EQ(trace.Take().front(), Call("VRKObjectDeliverMessage", object, both[0], parameters.Get(), 1));
    EXPECT_FALSE(Varnel::DeliverMessage(object, both[1], parameters, true));
    EXPECT_EQ(trace.Take().front(), Call("VRKObjectDeliverMessage", object, both[1], parameters.Get(), 0));
  }
  EXPECT_FALSE(Varnel::DeliverMessage(second.Get(), both[0], parameters, false));
  trace.Take();
  handler.SetObject(first.Get());
  EXPECT_TRUE(trace.Take().empty());
  first.Reset();
  EXPECT_EQ(calls, 5) << "with the object's death";
  EXPECT_FALSE(handler.IsRegistered());
}

TEST_F(CallbacksTest, StayOnTheObjectThatTheyMoveToAsTheirsDies) {
  const VRKToken died = MakeToken("message:orvane.vrk.object-died"), word = MakeToken("word");
  for (const bool returns : {false, true}) {  // to the object that died, which a sender only says
    const ObjectRef first = PlainObject(), second = PlainObject();
    int words = 0;
    std::unique_ptr<Handler> handler;
    handler = std::make_unique<Handler>([&](VRKObject, VRKToken message, const DictionaryRef&) {
      words += message == word;
      if (message != died) return true;
      handler->SetObject(second.Get());
      if (returns) handler->SetObject(first.Get());
      handler->AddMessages(&word, 1);
      return true;
    });
    handler->SetObject(first.Get());
    const VRKObject now = (returns ? first : second).Get();
    EXPECT_EQ(VRKObjectDeliverMessage(first.Get(), died, {}, 1), 0u);
    EXPECT_EQ(handler->Object(), now);
    EXPECT_EQ(VRKObjectDeliverMessage(now, word, {}, 1), 0u);
    EXPECT_EQ(words, 1);
    handler.reset();
    EXPECT_EQ(VRKObjectDeliverMessage(now, word, {}, 1), 256u);
  }
}

TEST_F(CallbacksTest, DieWithTheirObjectsIfTheyFailToMove) {
  ObjectRef object = PlainObject();
  Handler* handler = nullptr;
  handler = new Handler([&](auto&&...) { return handler->SetObject(VRKObject{0xFFFFFFFF}), true; }, object.Get(), true);
  object.Reset();
  EXPECT_EQ(Alive(), "");
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

// Reaches the factory's callback as another kernel would.
TEST_F(CallbacksTest, CheckWhatTheyAreGiven) {
  static const void* callback;
  const auto hook = [](const VRKHostTraceCall* call, void*) -> VRKResult {
    if (call->operation == std::string("VRKObjectFactoryRegister")) callback = call->arguments[2].pointer;
    return 0;
  };
  VRKHostSetTraceHook(hook, nullptr);
  const VRKToken word = MakeToken("word");
  int calls = 0;
  Factory factory([&](auto&&...) { ++calls; });
  factory.Register(word, 0);
  const auto create = AsCallback<VRKObjectFactoryCallback>(callback);
  VRKObject object{};
  EXPECT_EQ(create(word, {}, nullptr, &object), 13u);
  EXPECT_EQ(create(word, {}, &factory, nullptr), 13u);
  Coercion coercion([&](auto&&...) { return ++calls, false; });
  VRKData untouched{7};
  EXPECT_EQ(CodeOf([&] { coercion.Install({}, word); }), 13u);
  EXPECT_EQ(CodeOf([&] { coercion.Install(word, {}); }), 13u);
  EXPECT_EQ(CodeOf([&] { coercion.HandleCoercion({}, word, word, nullptr); }), 13u);
  EXPECT_EQ(calls, 0);
  EXPECT_FALSE(coercion.HandleCoercion({}, word, word, &untouched));
  EXPECT_EQ(untouched, VRKData{7});
  EXPECT_EQ(create(word, {}, &factory, &object), 0u);
  ObjectRef().Adopt(object);
}

// What the plug-in's own sweep does not reach: two objects, between which a handler moves about.
class Moves {
 public:
  explicit Moves(const Phase<Moves>&) { SetUp(); }

  // An error counts whether it can describe itself or not.
  void Fail() {
    const VRKResult result = VRKObjectDeliverMessage(object.Get(), MakeToken("fail"), EmptyDictionary().Get(), 1);
    if (result != Varnel::kResultCustomError) Varnel::ThrowResultCode(result);
  }
  void Move() {
    for (const ObjectRef& to : {other, object}) {
      const VRKToken fail = MakeToken("fail");
      mover->SetObject(to.Get());
      mover->AddMessages(&fail, 1);
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

  void Check(const Phase<Moves>& phase) {
    if (phase.run == &Moves::Move) {
      EXPECT_EQ(mover->IsRegistered(), Alive().find("handlers 2") != std::string::npos);
      EXPECT_EQ(mover->IsRegistered(), mover->Object() != VRKObject{});
    }
    EXPECT_EQ(CodeOf([&] { (this->*phase.run)(); }), 0u);
    SetUp();
    Fail();
    object.Reset();
    other.Reset();
    mover.reset();
    EXPECT_EQ(Alive(), "");
  }

 private:
  // The first object has a handler that lives with it, besides.
  void SetUp() {
    object = PlainObject();
    other = PlainObject();
    new Handler([](auto&&...) { return false; }, object.Get(), true);
    mover = std::make_unique<Handler>([](VRKObject, VRKToken message, const DictionaryRef&) -> bool {
      if (message == MakeToken("fail")) throw Custom(false);
      return false;
    });
    Move();
  }

  ObjectRef object, other;
  std::unique_ptr<Handler> mover;
};

TEST_F(CallbacksTest, SurviveEveryFault) {
  VRKHostSetErrorReporter([](auto...) -> uint32_t { return 0; }, nullptr);  // which allocates nothing
  const std::string alive = "objects 2 handlers 2 blocks 2 ";
  const Phase<Moves> phases[] = {{"fail", &Moves::Fail, Hears::kSome, 12, 3},
                                 {"move", &Moves::Move, Hears::kAll, 10, 4, alive, {alive, "objects 2 handlers 1 blocks 2 "}},
                                 {"construct", &Moves::Construct, Hears::kAll, 2, 3},
                                 {"convert", &Moves::Convert, Hears::kAll, 500, 90},
                                 {"report", &Moves::Report, Hears::kSome, 8, 1},
                                 {"delete themselves", &Moves::DeleteThemselves, Hears::kAll, 36, 7},
                                 {"die", &Moves::Die, Hears::kNothing, 2, 0, "objects 1 blocks 1 "}};
  for (const auto& phase : phases) SweepPhase(phase);
}

}  // namespace
