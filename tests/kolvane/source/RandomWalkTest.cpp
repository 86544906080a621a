// A walk over the kernel's operations and the translators' messages, in any order, beside a model that
// knows of each translator what it should answer.

#include <deque>
#include <map>
#include <memory>
#include <random>

#include "PlugInTest.h"
#include "ResultCodes.h"
#include "VRKTranslationImage.h"

namespace {

using namespace Varnel;

struct ModelTranslator {
  std::map<std::string, std::string> entries;
  int serving = 0;  // messages, which it outlives
  bool isDoomed = false;

  bool IsAlive() const { return !isDoomed || serving > 0; }
};
using Model = std::shared_ptr<ModelTranslator>;

// An object to which the walk has a reference, or had.
struct Translator {
  VRKObject object;
  Model model;
  bool isOwner;  // else it was made of the default class
  bool isServed = true;
  bool isReleased = false;
  int deliveries = 0;

  bool IsStale() const { return isReleased && deliveries == 0; }
  void EndService() {
    model->isDoomed = model->isDoomed || (isServed && isOwner);
    isServed = false;
  }
  // What a message results in that a translator takes.
  VRKResult Expected() const {
    if (IsStale()) return kVRKInvalidHandle;
    if (!isServed) return kVRKNotHandled;
    return model->IsAlive() ? 0 : kResultInvariantViolation;
  }
};

class RandomWalk : public PlugInTest {
 protected:
  ~RandomWalk() override {
    for (Translator& each : translators) Release(each);
    VRKHostPlugInTerminate(plugIn);
  }

  size_t Random(size_t count) { return random() % count; }
  std::string RandomName() { return "/n" + std::to_string(Random(6)); }
  std::string RandomValue() { return (Random(4) == 0 ? "$$$" + RandomName() + "=" : "") + "value " + std::to_string(random()); }
  std::string RandomKey() { return Random(9) == 0 ? "" : (Random(4) == 0 ? "" : "$$$") + RandomName() + "=" + RandomValue(); }

  bool DefaultIsAlive() const { return defaultModel != nullptr && defaultModel->IsAlive(); }

  std::string Answer(const ModelTranslator& model, const std::string& key) const {
    const std::string text = key.starts_with("$$$") ? key.substr(3) : key;
    const size_t equals = text.find('=');
    const std::string name = text.substr(0, equals);
    if (model.entries.contains(name)) return model.entries.at(name);
    if (DefaultIsAlive() && defaultModel->entries.contains(name)) return defaultModel->entries.at(name);
    return equals == std::string::npos ? "" : text.substr(equals + 1);
  }

  void Initialize() {
    ASSERT_EQ(VRKHostPlugInInitialize(plugIn), depth != 0 ? kVRKInUse : 0);
    if (depth != 0) return;
    isInitialised = true;
    kept.push_back(std::make_shared<ModelTranslator>());
    defaultModel = kept.back();
  }
  void Terminate() {
    ASSERT_EQ(VRKHostPlugInTerminate(plugIn), depth != 0 ? kVRKInUse : 0);
    if (depth != 0) return;
    isInitialised = false;
    for (const Model& each : kept) each->isDoomed = true;
    kept.clear();
  }

  void Create(bool isOwner) {
    const VRKToken objectClass = MakeToken(isOwner ? kClassStringTranslator : kClassDefaultStringTranslator);
    VRKObject object{};
    const VRKResult expected = !isInitialised ? kVRKNotFound : isOwner || DefaultIsAlive() ? 0 : kResultInvariantViolation;
    ASSERT_EQ(Noted(VRKObjectCreate(objectClass, {}, &object)), expected);
    if (expected == 0) translators.push_back({object, isOwner ? std::make_shared<ModelTranslator>() : defaultModel, isOwner});
  }
  void Release(Translator& which) {
    if (which.isReleased && which.deliveries > 0) return;  // that reference is the delivery's
    ASSERT_EQ(VRKObjectRelease(which.object), which.IsStale() ? kVRKInvalidHandle : 0);
    which.isReleased = true;
    if (which.IsStale()) which.EndService();
  }
  void TellOfDeath(Translator& whom) {
    const VRKResult expected = whom.IsStale() ? kVRKInvalidHandle : kVRKNotHandled;
    ASSERT_EQ(VRKObjectDeliverMessage(whom.object, MakeToken("message:orvane.vrk.object-died"), {}, 1), expected);
    whom.EndService();
  }

  static DataRef Data(const char* type, const std::string& bytes) {
    return MakeData(type, bytes.data(), static_cast<uint32_t>(bytes.size()));
  }
  static DictionaryRef With(const char* parameter, const DataRef& data) {
    DictionaryRef parameters;
    parameters.Create();
    parameters.SetEntry(MakeToken(parameter), data);
    return parameters;
  }
  VRKResult Send(const Translator& to, const char* message, const DictionaryRef& parameters = {}) {
    return Noted(VRKObjectDeliverMessage(to.object, MakeToken(message), parameters.Get(), 1));
  }
  VRKResult Noted(VRKResult result) { return ++results[result], result; }
  static std::string Result(const DictionaryRef& parameters) { return GetUTF8(parameters.GetEntry(MakeToken(kParameterMessageResult))); }

  void MakeDefault(const Translator& which) {
    ASSERT_EQ(Send(which, kMessageMakeDefault), which.Expected());
    if (which.Expected() == 0) defaultModel = which.model;
  }
  void SetTranslations(const Translator& of) {
    std::map<std::string, std::string> entries;
    std::string text = "// some translations\n";
    for (size_t i = Random(4); i > 0; --i) {
      const std::string name = RandomName();
      text += "\"$$$" + name + '=' + (entries[name] = RandomValue()) + "\"\n";
    }
    const auto image = PackTranslationImage(text.data(), static_cast<uint32_t>(text.size()));
    const DataRef data = MakeUTF16Data(image.units.get(), image.unitCount);
    ASSERT_EQ(Send(of, kMessageSetTranslations, With(kParameterTranslations, data)), of.Expected());
    if (of.Expected() != 0) return;
    for (const auto& [name, value] : entries) of.model->entries[name] = value;
  }
  void Translate(const Translator& by) {
    const std::string key = RandomKey();
    const DictionaryRef parameters = With(kParameterTranslationKey, Data(kTypeUTF8, key));
    ASSERT_EQ(Send(by, kMessageTranslateString, parameters), by.Expected());
    if (by.Expected() != 0) return;
    ASSERT_EQ(Result(parameters), Answer(*by.model, key) + '\0');
  }
  // A key that is no text yet is translated by the default translator before it is a translator's key.
  void TranslateKey(const Translator& by) {
    const std::string key = RandomKey();
    const bool isTaken = by.isServed && !by.IsStale();
    const VRKResult coerced = !isInitialised ? kResultInputContractViolation : DefaultIsAlive() ? 0 : kResultInvariantViolation;
    const VRKResult expected = isTaken && coerced != 0 ? coerced : by.Expected();
    const DictionaryRef parameters = With(kParameterTranslationKey, Data(kTypeLocaleIndependentUTF8, key));
    ASSERT_EQ(Send(by, kMessageTranslateString, parameters), expected);
    if (expected != 0) return;
    ASSERT_EQ(Result(parameters), Answer(*by.model, Answer(*defaultModel, key)) + '\0');
  }
  void Coerce() {
    const char* const types[] = {kTypeUTF8, kTypeUTF16LE, kTypeUTF16BE};
    const std::string key = RandomKey();
    VRKData coerced{};
    const VRKResult expected = !isInitialised ? kResultCannotCoerce : DefaultIsAlive() ? 0 : kResultInvariantViolation;
    const DataRef source = Data(kTypeLocaleIndependentUTF8, key);
    ASSERT_EQ(Noted(VRKDataCoerce(source.Get(), MakeToken(types[Random(3)]), &coerced)), expected);
    DataRef held;
    held.Adopt(coerced);
    if (expected != 0) return;
    ASSERT_EQ(GetUTF8(held), Answer(*defaultModel, key) + '\0');
  }

  // A coercion of the host's takes steps of its own while a translator's message is being served.
  void TranslateMeanwhile(Translator& by) {
    const std::string key = RandomKey();
    VRKResult expected = by.Expected();
    const bool isServed = by.isServed && !by.IsStale();
    std::string answer;
    Coercion coercion([&](const DataRef&, VRKToken, VRKToken, DataRef& result) {
      ++depth;
      for (size_t i = Random(3); i > 0; --i) Step();
      --depth;
      expected = by.model->IsAlive() ? 0 : kResultInvariantViolation;
      if (expected == 0) answer = Answer(*by.model, key);
      return result = Data(kTypeUTF8, key), true;
    });
    coercion.Install(MakeToken("type:test"), MakeToken(kTypeUTF8));
    const DictionaryRef parameters = With(kParameterTranslationKey, Data("type:test", key));
    ++by.deliveries;
    if (by.isOwner && isServed) ++by.model->serving;
    const VRKResult result = Send(by, kMessageTranslateString, parameters);
    --by.deliveries;
    if (by.isOwner && isServed) --by.model->serving;
    if (by.IsStale()) by.EndService();
    ASSERT_EQ(result, expected);
    if (expected != 0) return;
    ASSERT_EQ(Result(parameters), answer + '\0');
  }

  void Step() {
    const size_t kind = Random(48);
    if (kind < 1) return Initialize();
    if (kind < 2 && Random(3) == 0) return Terminate();
    if (kind < 8) return Create(kind % 2 == 0);
    if (kind < 12) return Coerce();
    if (translators.empty()) return;
    Translator& which = translators[Random(translators.size())];
    if (kind < 14) return Release(which);
    if (kind < 15) return TellOfDeath(which);
    if (kind < 20) return MakeDefault(which);
    if (kind < 28) return SetTranslations(which);
    if (kind < 38) return Translate(which);
    if (kind < 42) return TranslateKey(which);
    if (depth < 3) return TranslateMeanwhile(which);
  }

  std::mt19937 random;
  bool isInitialised = false;
  int depth = 0;
  Model defaultModel;
  std::vector<Model> kept;  // by the kernel, of the first translators
  std::deque<Translator> translators;
  std::map<VRKResult, int> results;
};

TEST_F(RandomWalk, AnswersAsTheModelDoes) {
  for (int step = 0; step < 50'000 && !HasFailure(); ++step) {
    SCOPED_TRACE(step);
    Step();
    if (translators.size() > 12) {
      Release(translators.front());
      translators.pop_front();
    }
  }
  for (const VRKResult result : {0u, kVRKInvalidHandle, kVRKNotFound, kResultInputContractViolation, kResultInvariantViolation,
                                 kResultNotHandled, kResultCannotCoerce}) {
    EXPECT_GT(results[result], 500) << result;
  }
}

// Anything, from anywhere: the host's trace hook, its reporter and its coercion, which fail at times,
// take steps of their own in the middle of others, and tell of deaths that are none. Only what is reached
// matters here, and that nothing is left.
class Interference : public PlugInTest {
 protected:
  size_t Random(size_t count) { return random() % count; }

  void Interfere() {
    if (depth > 3) return;
    ++depth;
    for (size_t i = Random(3); i > 0; --i) CodeOf([this] { Step(); });
    --depth;
  }
  static VRKResult VRK_CALL Hook(const VRKHostTraceCall* call, void* context) {
    auto& self = *static_cast<Interference*>(context);
    const std::string operation = call->operation;
    if (operation == "VRKMessageHandlerInstall") self.latest = VRKObject{call->arguments[0].number};
    const bool isRare = operation.ends_with("Unregister") || operation.ends_with("HandlerRemove") || operation.ends_with("AddMessages");
    if (self.Random(isRare ? 3 : 40) == 0) self.Interfere();
    const bool givesUp = CallTrace::GivesUp(operation);
    return !givesUp && self.Random(60) == 0 ? CallTrace::kFailure : 0;
  }
  static uint32_t VRK_CALL Reporter(uint32_t, const char*, const char*, const char*, uint32_t, const char*, uint32_t* onceFlag,
                                    void* context) {
    auto& self = *static_cast<Interference*>(context);
    self.Interfere();
    *onceFlag = self.Random(2) != 0;
    return 0;
  }

  DataRef RandomData(const std::string& text) {
    const char* const types[] = {kTypeUTF8, kTypeLocaleIndependentUTF8, "type:test", kTypeUTF16LE, kTypeUTF16};
    return MakeData(types[Random(5)], text.data(), static_cast<uint32_t>(text.size()));
  }
  void Send(const char* message, const char* parameter = nullptr, const std::string& text = {}) {
    const VRKObject receiver = objects.empty() || Random(4) == 0 ? latest : objects[Random(objects.size())];
    DictionaryRef parameters;
    parameters.Create();
    if (parameter != nullptr) parameters.SetEntry(MakeToken(parameter), RandomData(text));
    VRKObjectDeliverMessage(receiver, MakeToken(message), parameters.Get(), 1);
  }
  void Create() {
    DictionaryRef parameters;
    parameters.Create();
    if (Random(2) == 0) parameters.SetEntry(MakeToken("parameter:test"), RandomData("x"));
    VRKObject object{};
    VRKObjectCreate(MakeToken(Random(2) == 0 ? kClassStringTranslator : kClassDefaultStringTranslator), parameters.Get(), &object);
    if (object != VRKObject{}) objects.push_back(object);
  }
  void Release() {
    if (objects.empty()) return;
    std::swap(objects.back(), objects[Random(objects.size())]);
    const VRKObject released = objects.back();
    objects.pop_back();
    VRKObjectRelease(released);
  }
  void Coerce() {
    const char* const types[] = {kTypeUTF8, kTypeUTF16LE, kTypeUTF16BE, kTypeUTF16};
    DataRef coerced;
    RandomData("$$$/k=x").Coerce(MakeToken(types[Random(4)]), coerced);
  }
  void Step() {
    const size_t kind = Random(16);
    if (kind < 4) return objects.size() < 20 ? Create() : Release();
    if (kind < 6) return Release();
    if (kind < 8) return Send(kMessageMakeDefault);
    if (kind < 10) return Send(kMessageSetTranslations, kParameterTranslations, "\"$$$/k=v\"\n\"$$$/n=tralala\"\n");
    if (kind < 13) return Send(kMessageTranslateString, kParameterTranslationKey, "$$$/k=x");
    if (kind < 14) return Coerce();
    if (kind < 15) return Send("message:orvane.vrk.object-died");
    static_cast<void>(Random(4) != 0 ? VRKHostPlugInInitialize(plugIn) : VRKHostPlugInTerminate(plugIn));
  }

  std::mt19937 random;
  int depth = 0;
  std::vector<VRKObject> objects;
  VRKObject latest{};
};

TEST_F(Interference, ReachesNothingThatIsGone) {
  Coercion coercion([this](const DataRef&, VRKToken, VRKToken toType, DataRef& result) {
    Interfere();
    if (Random(5) == 0) return false;
    result.Create(toType, "ab=c", 4);
    return true;
  });
  for (const char* const type : {kTypeUTF8, kTypeUTF16, kTypeUTF16LE, kTypeUTF16BE})
    coercion.Install(MakeToken("type:test"), MakeToken(type));
  VRKHostSetErrorReporter(&Reporter, this);
  VRKHostSetTraceHook(&Hook, this);
  for (int step = 0; step < 20'000; ++step) CodeOf([this] { Step(); });
  VRKHostSetTraceHook(nullptr, nullptr);
  VRKHostSetErrorReporter(nullptr, nullptr);
  while (!objects.empty()) Release();
  VRKHostPlugInTerminate(plugIn);
}

}  // namespace
