// A walk over translator objects and the plug-in that serves them, beside a model that knows what
// each of them answers.
#pragma once

#include <deque>
#include <map>
#include <memory>
#include <sstream>
#include <string>

#include "fuzz/Choices.h"
#include "fuzz/Input.h"
#include "kolvane/api/wrapper-framework/VRKStringTranslatorProtocol.h"
#include "kolvane/lib/DictionaryTable.h"
#include "kolvane/lib/DictionaryWriter.h"
#include "tests/kolvane/source/Messages.h"
#include "varnel-kernel/VarnelKernelHost.h"
#include "wrapper-framework/source/DataCoercion.h"
#include "wrapper-framework/source/ResultCodes.h"

// The model of a translator.
struct ModelTranslator {
  bool IsAlive() const { return !isDoomed || serving > 0; }

  std::map<std::string, std::string> entries;
  int serving = 0;  // messages, which it outlives
  bool isDoomed = false;
};

// An object to which the walk has a reference, or had.
struct WalkedObject {
  bool IsStale() const { return isReleased && deliveries == 0; }
  bool TakesMessages() const { return isServed && !IsStale(); }

  // Its handler goes, and with an owner's the translator.
  void EndService() {
    model->isDoomed = model->isDoomed || (isServed && isOwner);
    isServed = false;
  }

  // What a message results in that translators take.
  VRKResult Expected() const {
    if (IsStale()) return kVRKInvalidHandle;
    if (!isServed) return kVRKNotHandled;
    return model->IsAlive() ? kVRKNoError : Varnel::kResultInvariantViolation;
  }

  VRKObject object;
  std::shared_ptr<ModelTranslator> model;
  bool isOwner;  // else it was made of the default class
  bool isServed = true;
  bool isReleased = false;
  int deliveries = 0;
};

// Little-endian UTF-16 with a byte-order mark.
inline std::string AsUTF16(const std::string& text) {
  Varnel::DataRef units;
  const VRKToken type = Varnel::MakeToken(Varnel::kTypeUTF16);
  Require(DataOf(Varnel::kTypeUTF8, text).Coerce(type, units), "text is coerced");
  return RawText(units);
}

inline std::string AsBinary(const std::string& text, uint32_t number) {
  using tovali_private::BinaryVersion;
  constexpr TextEncoding kEncodings[] = {TextEncoding::kUTF16LE, TextEncoding::kUTF8};
  DictionaryTable table;
  std::istringstream image(text);
  table.Load(image);
  std::ostringstream out;
  const BinaryVersion version = number < 2 ? BinaryVersion::k1_0 : BinaryVersion::k1_5;
  Require(WriteBinary(table, version, kEncodings[number % 2], out).empty(), "all is carried");
  return out.str();
}

// Coerces what the walk gives it to itself, after a callback.
template <class Meanwhile>
class WalkCoercion final : public Varnel::DataCoercion {
 public:
  static constexpr char kType[] = "type:walk";

  explicit WalkCoercion(Meanwhile callback) : meanwhile(callback) {
    Install(Varnel::MakeToken(kType), Varnel::MakeToken(Varnel::kTypeUTF8));
  }
  bool HandleCoercionImpl(const Varnel::DataRef& source, VRKToken, VRKToken,
                          Varnel::DataRef& result) override {
    meanwhile();
    result = DataOf(Varnel::kTypeUTF8, RawText(source));
    return true;
  }

 private:
  Meanwhile meanwhile;
};

// Ends the process where an answer is not the model's. In one kernel there is one walk at a time.
class TranslatorWalk {
 public:
  TranslatorWalk(Choices& decisions, VRKPlugIn walkedPlugIn)
      : choices(decisions), plugIn(walkedPlugIn) {}
  TranslatorWalk(const TranslatorWalk&) = delete;
  TranslatorWalk& operator=(const TranslatorWalk&) = delete;

  // Does one thing, in which others may be nested.
  void Step() {
    const uint32_t kind = choices.Below(48);
    if (kind < 1) return Initialize();
    if (kind < 2) return choices.OneIn(3) ? Terminate() : Initialize();
    if (kind < 8) return Create(kind % 2 == 0);
    if (kind < 12) return Coerce();
    if (objects.empty()) return;
    WalkedObject& which = objects[choices.Below(static_cast<uint32_t>(objects.size()))];
    if (kind < 14) return Release(which);
    if (kind < 15) return TellOfDeath(which);
    if (kind < 20) return MakeDefault(which);
    if (kind < 28) return SetTranslations(which);
    if (kind < 38) return Translate(which);
    if (kind < 42) return TranslateLocaleIndependent(which);
    if (depth < kMostNesting) return TranslateMeanwhile(which);
  }

  // Releases every object and terminates the plug-in. Steps may follow.
  void Rest() {
    for (WalkedObject& each : objects) Release(each);
    objects.clear();
    Terminate();
  }

  // Messages delivered and keys coerced, by their results.
  const std::map<VRKResult, uint64_t>& Results() const { return results; }

 private:
  using Model = std::shared_ptr<ModelTranslator>;

  static constexpr int kMostNesting = 3;
  static constexpr size_t kMostObjects = 12;

  void Initialize() {
    const VRKResult result = VRKHostPlugInInitialize(plugIn);
    Require(result == (depth != 0 ? kVRKInUse : 0), "the plug-in initialises, but while it runs");
    if (depth != 0) return;
    isInitialised = true;
    kept.push_back(std::make_shared<ModelTranslator>());
    defaultModel = kept.back();
  }

  void Terminate() {
    const VRKResult result = VRKHostPlugInTerminate(plugIn);
    Require(result == (depth != 0 ? kVRKInUse : 0), "the plug-in terminates, but while it runs");
    if (depth != 0) return;
    isInitialised = false;
    for (const Model& each : kept) each->isDoomed = true;
    kept.clear();
  }

  void Create(bool isOwner) {
    while (depth == 0 && objects.size() >= kMostObjects) {
      Release(objects.front());
      objects.pop_front();
    }
    using namespace Varnel;
    const VRKToken name =
        MakeToken(isOwner ? kClassStringTranslator : kClassDefaultStringTranslator);
    const VRKResult made = isOwner ? VRKResult{kVRKNoError} : OfDefault();
    VRKObject object{};
    const VRKResult result = Noted(VRKObjectCreate(name, {}, &object));
    Require(result == (isInitialised ? made : kVRKNotFound), "objects are made");
    if (result != 0) return;
    objects.push_back(
        {object, isOwner ? std::make_shared<ModelTranslator>() : defaultModel, isOwner});
  }

  void Release(WalkedObject& which) {
    if (which.isReleased && which.deliveries > 0) return;  // that reference is the delivery's
    const VRKResult expected = which.IsStale() ? kVRKInvalidHandle : kVRKNoError;
    Require(VRKObjectRelease(which.object) == expected, "an object is released once");
    which.isReleased = true;
    if (which.IsStale()) which.EndService();
  }

  void TellOfDeath(WalkedObject& whom) {
    const VRKResult expected = whom.IsStale() ? kVRKInvalidHandle : kVRKNotHandled;
    const VRKResult result = ::Send(whom.object, "message:orvane.vrk.object-died");
    Require(result == expected, "nobody takes a death");
    whom.EndService();
  }

  void MakeDefault(const WalkedObject& which) {
    const VRKResult expected = which.Expected();
    const VRKResult result = Send(which, Varnel::kMessageMakeDefault);
    Require(result == expected, "make-default results as it should");
    if (expected == 0) defaultModel = which.model;
  }

  void SetTranslations(const WalkedObject& of) {
    using namespace Varnel;
    std::map<std::string, std::string> entries;
    for (uint32_t i = choices.Below(4); i > 0; --i) entries.insert({RandomName(), RandomValue()});
    const std::string image = RandomImage(entries);
    const auto packed = PackTranslationImage(image.data(), static_cast<uint32_t>(image.size()));
    const DataRef data = MakeUTF16Data(packed.units.get(), packed.unitCount);
    const VRKResult expected = of.Expected();
    const VRKResult result = Send(of, kMessageSetTranslations, With(kParameterTranslations, data));
    Require(result == expected, "set-translations results as it should");
    if (expected != 0) return;
    for (const auto& [name, value] : entries) of.model->entries[name] = value;
  }

  void Translate(const WalkedObject& by) {
    const std::string key = RandomKey();
    const Varnel::DictionaryRef parameters = WithKey(Varnel::kTypeUTF8, key);
    const VRKResult result = Send(by, Varnel::kMessageTranslateString, parameters);
    Require(result == by.Expected(), "translate-string results as it should");
    if (result != 0) return;
    Require(Holds(parameters, Answer(*by.model, key)), "a translator answers as its model does");
  }

  // The default translator translates such a key before it is a translator's key.
  void TranslateLocaleIndependent(const WalkedObject& by) {
    const std::string key = RandomKey();
    const VRKResult coerced =
        isInitialised ? OfDefault() : VRKResult{Varnel::kResultInputContractViolation};
    const VRKResult expected = by.TakesMessages() && coerced != 0 ? coerced : by.Expected();
    const Varnel::DictionaryRef parameters = WithKey(Varnel::kTypeLocaleIndependentUTF8, key);
    const VRKResult result = Send(by, Varnel::kMessageTranslateString, parameters);
    Require(result == expected, "a locale-independent key results as it should");
    if (expected != 0) return;
    const std::string answer = Answer(*by.model, Answer(*defaultModel, key));
    Require(Holds(parameters, answer), "such a key is translated twice");
  }

  // Steps are taken while the message is being served.
  void TranslateMeanwhile(WalkedObject& by) {
    const std::string key = RandomKey();
    const bool isServed = by.TakesMessages();
    VRKResult expected = by.Expected();
    std::string answer;
    const WalkCoercion coercion([&] {
      ++depth;
      for (uint32_t i = choices.Below(3); i > 0; --i) Step();
      --depth;
      expected = by.model->IsAlive() ? kVRKNoError : Varnel::kResultInvariantViolation;
      if (expected == 0) answer = Answer(*by.model, key);
    });
    const Varnel::DictionaryRef parameters = WithKey(coercion.kType, key);
    ++by.deliveries;
    if (by.isOwner && isServed) ++by.model->serving;
    const VRKResult result = Send(by, Varnel::kMessageTranslateString, parameters);
    --by.deliveries;
    if (by.isOwner && isServed) --by.model->serving;
    if (by.IsStale()) by.EndService();
    Require(result == expected, "what happens meanwhile decides");
    if (expected == 0) Require(Holds(parameters, answer), "and so does what is loaded meanwhile");
  }

  void Coerce() {
    using namespace Varnel;
    const char* const types[] = {kTypeUTF8, kTypeUTF16LE, kTypeUTF16BE};
    const std::string key = RandomKey();
    const VRKResult expected = isInitialised ? OfDefault() : VRKResult{kResultCannotCoerce};
    const DataRef source = DataOf(kTypeLocaleIndependentUTF8, key);
    VRKData coerced{};
    const VRKToken type = MakeToken(types[choices.Below(3)]);
    Require(Noted(VRKDataCoerce(source.Get(), type, &coerced)) == expected, "keys are coerced");
    DataRef held;
    held.Adopt(coerced);
    if (expected != 0) return;
    Require(GetUTF8(held) == Answer(*defaultModel, key) + '\0', "to the default's translation");
  }

  std::string RandomName() { return "/n" + std::to_string(choices.Below(6)); }

  std::string RandomValue() {
    const std::string value = "value \u20AC\U0001F600" + std::to_string(choices.Below(65536));
    return choices.OneIn(4) ? "$$$" + RandomName() + "=" + value : value;
  }

  // Some end at a zero.
  std::string RandomKey() {
    if (choices.OneIn(9)) return "";
    const std::string key = (choices.OneIn(4) ? "" : "$$$") + RandomName() + "=" + RandomValue();
    return choices.OneIn(4) ? key + '\0' + RandomName() : key;
  }

  // A text of the entries, or a binary dictionary made of it.
  std::string RandomImage(const std::map<std::string, std::string>& entries) {
    std::string text = "// some translations\n";
    for (const auto& [name, value] : entries) text += "\"$$$" + name + '=' + value + "\"\n";
    text = AsUTF16(text);
    const uint32_t form = choices.Below(8);
    return form < 4 ? AsBinary(text, form) : text;
  }

  bool DefaultIsAlive() const { return defaultModel != nullptr && defaultModel->IsAlive(); }
  VRKResult OfDefault() const {
    return DefaultIsAlive() ? kVRKNoError : Varnel::kResultInvariantViolation;
  }

  std::string Answer(const ModelTranslator& model, const std::string& key) const {
    const std::string text = (key.starts_with("$$$") ? key.substr(3) : key).c_str();
    const size_t equals = text.find('=');
    const std::string name = text.substr(0, equals);
    if (model.entries.contains(name)) return model.entries.at(name);
    if (DefaultIsAlive() && defaultModel->entries.contains(name)) {
      return defaultModel->entries.at(name);
    }
    return equals == std::string::npos ? "" : text.substr(equals + 1);
  }

  static Varnel::DictionaryRef WithKey(const char* type, const std::string& key) {
    return With(Varnel::kParameterTranslationKey, DataOf(type, key));
  }
  static bool Holds(const Varnel::DictionaryRef& parameters, const std::string& answer) {
    const VRKToken result = Varnel::MakeToken(Varnel::kParameterMessageResult);
    return Varnel::GetUTF8(parameters.GetEntry(result)) == answer + '\0';
  }

  VRKResult Send(const WalkedObject& to, const char* message,
                 const Varnel::DictionaryRef& parameters = {}) {
    return Noted(::Send(to.object, message, parameters));
  }

  VRKResult Noted(VRKResult result) {
    ++results[result];
    return result;
  }

  Choices& choices;
  const VRKPlugIn plugIn;
  bool isInitialised = false;
  int depth = 0;
  Model defaultModel;
  std::deque<Model> kept;  // by the kernel, of the first translators
  std::deque<WalkedObject> objects;
  std::map<VRKResult, uint64_t> results;
};
