#include "TranslatorWalk.h"

#include <sstream>
#include <vector>

#include "Data.h"
#include "DataCoercion.h"
#include "DictionaryTable.h"
#include "DictionaryWriter.h"
#include "Input.h"
#include "ResultCodes.h"
#include "Tokens.h"
#include "VRKStringTranslatorProtocol.h"
#include "VRKTranslationImage.h"

namespace {

using namespace Varnel;

constexpr int kMostNesting = 3;
constexpr size_t kMostObjects = 12;
constexpr char kTypeWalk[] = "type:walk";

DataRef MakeDataOf(const char* type, const std::string& bytes) {
  return MakeData(type, bytes.data(), static_cast<uint32_t>(bytes.size()));
}

DictionaryRef With(const char* parameter, const DataRef& data) {
  DictionaryRef parameters;
  parameters.Create();
  parameters.SetEntry(MakeToken(parameter), data);
  return parameters;
}

bool Holds(const DictionaryRef& parameters, const std::string& answer) {
  return GetUTF8(parameters.GetEntry(MakeToken(kParameterMessageResult))) == answer + '\0';
}

// Little-endian UTF-16 with a byte-order mark.
std::string AsUTF16(const std::string& text) {
  DataRef units;
  Require(MakeDataOf(kTypeUTF8, text).Coerce(MakeToken(kTypeUTF16), units), "text is coerced");
  const RawPayload payload = GetRawPayload(units);
  return {static_cast<const char*>(payload.bytes), payload.byteCount};
}

std::string AsBinary(const std::string& text, uint32_t number) {
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
class WalkCoercion final : public DataCoercion {
 public:
  explicit WalkCoercion(Meanwhile callback) : meanwhile(callback) {
    Install(MakeToken(kTypeWalk), MakeToken(kTypeUTF8));
  }
  bool HandleCoercionImpl(const DataRef& source, VRKToken, VRKToken, DataRef& result) override {
    meanwhile();
    result = MakeDataOf(kTypeUTF8, GetRawText(source));
    return true;
  }

 private:
  static std::string GetRawText(const DataRef& data) {
    const RawPayload payload = GetRawPayload(data);
    return {static_cast<const char*>(payload.bytes), payload.byteCount};
  }

  Meanwhile meanwhile;
};

}  // namespace

void WalkedObject::EndService() {
  model->isDoomed = model->isDoomed || (isServed && isOwner);
  isServed = false;
}

VRKResult WalkedObject::Expected() const {
  if (IsStale()) return kVRKInvalidHandle;
  if (!isServed) return kVRKNotHandled;
  return model->IsAlive() ? kVRKNoError : kResultInvariantViolation;
}

TranslatorWalk::TranslatorWalk(Choices& decisions, VRKPlugIn walkedPlugIn)
    : choices(decisions), plugIn(walkedPlugIn) {}

void TranslatorWalk::Step() {
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

void TranslatorWalk::Rest() {
  for (WalkedObject& each : objects) Release(each);
  objects.clear();
  Terminate();
}

void TranslatorWalk::Initialize() {
  const VRKResult result = VRKHostPlugInInitialize(plugIn);
  Require(result == (depth != 0 ? kVRKInUse : 0), "the plug-in initialises, but while it runs");
  if (depth != 0) return;
  isInitialised = true;
  kept.push_back(std::make_shared<ModelTranslator>());
  defaultModel = kept.back();
}

void TranslatorWalk::Terminate() {
  const VRKResult result = VRKHostPlugInTerminate(plugIn);
  Require(result == (depth != 0 ? kVRKInUse : 0), "the plug-in terminates, but while it runs");
  if (depth != 0) return;
  isInitialised = false;
  for (const Model& each : kept) each->isDoomed = true;
  kept.clear();
}

void TranslatorWalk::Create(bool isOwner) {
  while (depth == 0 && objects.size() >= kMostObjects) {
    Release(objects.front());
    objects.pop_front();
  }
  const char* const name = isOwner ? kClassStringTranslator : kClassDefaultStringTranslator;
  const VRKResult expected = !isInitialised                ? kVRKNotFound
                             : isOwner || DefaultIsAlive() ? kVRKNoError
                                                           : kResultInvariantViolation;
  VRKObject object{};
  Require(Noted(VRKObjectCreate(MakeToken(name), {}, &object)) == expected, "objects are made");
  if (expected != 0) return;
  objects.push_back(
      {object, isOwner ? std::make_shared<ModelTranslator>() : defaultModel, isOwner});
}

void TranslatorWalk::Release(WalkedObject& which) {
  if (which.isReleased && which.deliveries > 0) return;  // that reference is the delivery's
  const VRKResult expected = which.IsStale() ? kVRKInvalidHandle : kVRKNoError;
  Require(VRKObjectRelease(which.object) == expected, "an object is released once");
  which.isReleased = true;
  if (which.IsStale()) which.EndService();
}

void TranslatorWalk::TellOfDeath(WalkedObject& whom) {
  const VRKResult expected = whom.IsStale() ? kVRKInvalidHandle : kVRKNotHandled;
  const VRKToken died = MakeToken("message:orvane.vrk.object-died");
  Require(VRKObjectDeliverMessage(whom.object, died, {}, 1) == expected, "nobody takes a death");
  whom.EndService();
}

void TranslatorWalk::MakeDefault(const WalkedObject& which) {
  const VRKResult expected = which.Expected();
  Require(Send(which, kMessageMakeDefault) == expected, "make-default results as it should");
  if (expected == 0) defaultModel = which.model;
}

void TranslatorWalk::SetTranslations(const WalkedObject& of) {
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

void TranslatorWalk::Translate(const WalkedObject& by) {
  const std::string key = RandomKey();
  const DictionaryRef parameters = With(kParameterTranslationKey, MakeDataOf(kTypeUTF8, key));
  const VRKResult result = Send(by, kMessageTranslateString, parameters);
  Require(result == by.Expected(), "translate-string results as it should");
  if (result != 0) return;
  Require(Holds(parameters, Answer(*by.model, key)), "a translator answers as its model does");
}

// The default translator translates such a key before it is a translator's key.
void TranslatorWalk::TranslateLocaleIndependent(const WalkedObject& by) {
  const std::string key = RandomKey();
  const VRKResult coerced = !isInitialised     ? kResultInputContractViolation
                            : DefaultIsAlive() ? kVRKNoError
                                               : kResultInvariantViolation;
  const VRKResult expected = by.TakesMessages() && coerced != 0 ? coerced : by.Expected();
  const DataRef data = MakeDataOf(kTypeLocaleIndependentUTF8, key);
  const DictionaryRef parameters = With(kParameterTranslationKey, data);
  const VRKResult result = Send(by, kMessageTranslateString, parameters);
  Require(result == expected, "a locale-independent key results as it should");
  if (expected != 0) return;
  const std::string answer = Answer(*by.model, Answer(*defaultModel, key));
  Require(Holds(parameters, answer), "such a key is translated twice");
}

// Steps are taken while the message is being served.
void TranslatorWalk::TranslateMeanwhile(WalkedObject& by) {
  const std::string key = RandomKey();
  const bool isServed = by.TakesMessages();
  VRKResult expected = by.Expected();
  std::string answer;
  const WalkCoercion coercion([&] {
    ++depth;
    for (uint32_t i = choices.Below(3); i > 0; --i) Step();
    --depth;
    expected = by.model->IsAlive() ? kVRKNoError : kResultInvariantViolation;
    if (expected == 0) answer = Answer(*by.model, key);
  });
  const DictionaryRef parameters = With(kParameterTranslationKey, MakeDataOf(kTypeWalk, key));
  ++by.deliveries;
  if (by.isOwner && isServed) ++by.model->serving;
  const VRKResult result = Send(by, kMessageTranslateString, parameters);
  --by.deliveries;
  if (by.isOwner && isServed) --by.model->serving;
  if (by.IsStale()) by.EndService();
  Require(result == expected, "what happens meanwhile decides");
  if (expected == 0) Require(Holds(parameters, answer), "and so does what is loaded meanwhile");
}

void TranslatorWalk::Coerce() {
  const char* const types[] = {kTypeUTF8, kTypeUTF16LE, kTypeUTF16BE};
  const std::string key = RandomKey();
  const VRKResult expected = !isInitialised     ? kResultCannotCoerce
                             : DefaultIsAlive() ? kVRKNoError
                                                : kResultInvariantViolation;
  const DataRef source = MakeDataOf(kTypeLocaleIndependentUTF8, key);
  VRKData coerced{};
  const VRKToken type = MakeToken(types[choices.Below(3)]);
  Require(Noted(VRKDataCoerce(source.Get(), type, &coerced)) == expected, "keys are coerced");
  DataRef held;
  held.Adopt(coerced);
  if (expected != 0) return;
  Require(GetUTF8(held) == Answer(*defaultModel, key) + '\0', "to the default's translation");
}

std::string TranslatorWalk::RandomName() {
  return "/n" + std::to_string(choices.Below(6));
}

std::string TranslatorWalk::RandomValue() {
  const std::string value = "value \u20AC\U0001F600" + std::to_string(choices.Below(65536));
  return choices.OneIn(4) ? "$$$" + RandomName() + "=" + value : value;
}

std::string TranslatorWalk::RandomKey() {
  if (choices.OneIn(9)) return "";
  return (choices.OneIn(4) ? "" : "$$$") + RandomName() + "=" + RandomValue();
}

// A text of the entries, or a binary dictionary made of it.
std::string TranslatorWalk::RandomImage(const std::map<std::string, std::string>& entries) {
  std::string text = "// some translations\n";
  for (const auto& [name, value] : entries) text += "\"$$$" + name + '=' + value + "\"\n";
  text = AsUTF16(text);
  const uint32_t form = choices.Below(8);
  return form < 4 ? AsBinary(text, form) : text;
}

std::string TranslatorWalk::Answer(const ModelTranslator& model, const std::string& key) const {
  const std::string text = key.starts_with("$$$") ? key.substr(3) : key;
  const size_t equals = text.find('=');
  const std::string name = text.substr(0, equals);
  if (model.entries.contains(name)) return model.entries.at(name);
  if (DefaultIsAlive() && defaultModel->entries.contains(name)) {
    return defaultModel->entries.at(name);
  }
  return equals == std::string::npos ? "" : text.substr(equals + 1);
}

VRKResult TranslatorWalk::Send(const WalkedObject& to, const char* message,
                               const DictionaryRef& parameters) {
  return Noted(VRKObjectDeliverMessage(to.object, MakeToken(message), parameters.Get(), 1));
}

VRKResult TranslatorWalk::Noted(VRKResult result) {
  ++results[result];
  return result;
}
