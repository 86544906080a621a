// Anything, from anywhere: a host's trace hook, its error reporter and its coercion, which fail at
// times, take steps of their own in the middle of others, and tell of deaths that are none. No
// model could follow: what counts is that nothing is reached that is gone, and nothing left over.
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "Choices.h"
#include "Data.h"
#include "DataCoercion.h"
#include "Input.h"
#include "PlugInRun.h"
#include "Tokens.h"
#include "VRKStringTranslatorProtocol.h"

namespace {

using namespace Varnel;

constexpr int kMostNesting = 3;
constexpr size_t kMostObjects = 20;
constexpr VRKResult kFailure = 4242;
constexpr char kTypeWalk[] = "type:walk";

// What makes a holder's destructor fail would keep alive what the holder was to give up.
bool GivesUp(std::string_view operation) {
  return operation.ends_with("Release") || operation.ends_with("Deallocate") ||
         operation.ends_with("Remove") || operation.ends_with("Unregister");
}

class Interference {
 public:
  Interference(Choices& decisions, VRKPlugIn walkedPlugIn)
      : choices(decisions), plugIn(walkedPlugIn) {
    VRKHostSetErrorReporter(&Report, this);
    VRKHostSetTraceHook(&Hook, this);
  }
  ~Interference() {
    VRKHostSetTraceHook(nullptr, nullptr);
    VRKHostSetErrorReporter(nullptr, nullptr);
    while (!objects.empty()) Release();
    VRKHostPlugInTerminate(plugIn);
  }
  Interference(const Interference&) = delete;
  Interference& operator=(const Interference&) = delete;

  // Any failure of the kernel may end it.
  void Step() noexcept;
  void Interfere();
  bool OneIn(uint32_t count) { return choices.OneIn(count); }

 private:
  static VRKResult VRK_CALL Hook(const VRKHostTraceCall* call, void* context);
  static uint32_t VRK_CALL Report(uint32_t, const char*, const char*, const char*, uint32_t,
                                  const char*, uint32_t* onceFlag, void* context);

  void TakeStep();
  void Create();
  void Release();
  void Coerce();
  void Send(const char* message, const char* parameter = nullptr, const std::string& text = {});
  DataRef RandomData(const std::string& text);

  Choices& choices;
  const VRKPlugIn plugIn;
  int depth = 0;
  std::vector<VRKObject> objects;
  VRKObject latest{};  // to which a handler was attached
};

void Interference::Step() noexcept {
  try {
    TakeStep();
  } catch (...) {
  }
}

void Interference::Interfere() {
  if (depth > kMostNesting) return;
  ++depth;
  for (uint32_t i = choices.Below(3); i > 0; --i) Step();
  --depth;
}

void Interference::TakeStep() {
  const uint32_t kind = choices.Below(16);
  if (kind < 4) return objects.size() < kMostObjects ? Create() : Release();
  if (kind < 6) return Release();
  if (kind < 8) return Send(kMessageMakeDefault);
  if (kind < 10) {
    return Send(kMessageSetTranslations, kParameterTranslations,
                "\"$$$/k=v\"\n\"$$$/n=tralala\"\n");
  }
  if (kind < 13) return Send(kMessageTranslateString, kParameterTranslationKey, "$$$/k=x");
  if (kind < 14) return Coerce();
  if (kind < 15) return Send("message:orvane.vrk.object-died");
  static_cast<void>(choices.OneIn(4) ? VRKHostPlugInTerminate(plugIn)
                                     : VRKHostPlugInInitialize(plugIn));
}

VRKResult VRK_CALL Interference::Hook(const VRKHostTraceCall* call, void* context) {
  auto& self = *static_cast<Interference*>(context);
  const std::string_view operation = call->operation;
  if (operation == "VRKMessageHandlerInstall") {
    self.latest = VRKObject{call->arguments[0].number};
  }
  const bool isRare = operation.ends_with("Unregister") || operation.ends_with("HandlerRemove") ||
                      operation.ends_with("AddMessages");
  if (self.OneIn(isRare ? 3 : 40)) self.Interfere();
  return !GivesUp(operation) && self.OneIn(60) ? kFailure : kVRKNoError;
}

uint32_t VRK_CALL Interference::Report(uint32_t, const char*, const char*, const char*, uint32_t,
                                       const char*, uint32_t* onceFlag, void* context) {
  auto& self = *static_cast<Interference*>(context);
  self.Interfere();
  *onceFlag = self.OneIn(2) ? 0 : 1;
  return 0;
}

void Interference::Create() {
  const char* const name =
      choices.OneIn(2) ? kClassStringTranslator : kClassDefaultStringTranslator;
  DictionaryRef parameters;
  parameters.Create();
  if (choices.OneIn(2)) parameters.SetEntry(MakeToken("parameter:walk"), RandomData("x"));
  VRKObject object{};
  VRKObjectCreate(MakeToken(name), parameters.Get(), &object);
  if (object != VRKObject{}) objects.push_back(object);
}

void Interference::Release() {
  if (objects.empty()) return;
  std::swap(objects.back(), objects[choices.Below(static_cast<uint32_t>(objects.size()))]);
  const VRKObject released = objects.back();
  objects.pop_back();
  VRKObjectRelease(released);
}

void Interference::Coerce() {
  const char* const types[] = {kTypeUTF8, kTypeUTF16LE, kTypeUTF16BE, kTypeUTF16};
  DataRef coerced;
  RandomData("$$$/k=x").Coerce(MakeToken(types[choices.Below(4)]), coerced);
}

void Interference::Send(const char* message, const char* parameter, const std::string& text) {
  const bool toLatest = objects.empty() || choices.OneIn(4);
  const VRKObject receiver =
      toLatest ? latest : objects[choices.Below(static_cast<uint32_t>(objects.size()))];
  DictionaryRef parameters;
  parameters.Create();
  if (parameter != nullptr) parameters.SetEntry(MakeToken(parameter), RandomData(text));
  VRKObjectDeliverMessage(receiver, MakeToken(message), parameters.Get(), 1);
}

DataRef Interference::RandomData(const std::string& text) {
  const char* const types[] = {kTypeUTF8, kTypeLocaleIndependentUTF8, kTypeWalk, kTypeUTF16LE,
                               kTypeUTF16};
  return MakeData(types[choices.Below(5)], text.data(), static_cast<uint32_t>(text.size()));
}

// Gives a text of its own, or does not, and interferes in any case.
class InterferingCoercion final : public DataCoercion {
 public:
  explicit InterferingCoercion(Interference*& walk) : interference(walk) {
    for (const char* const type : {kTypeUTF8, kTypeUTF16, kTypeUTF16LE, kTypeUTF16BE}) {
      Install(MakeToken(kTypeWalk), MakeToken(type));
    }
  }
  bool HandleCoercionImpl(const DataRef&, VRKToken, VRKToken toType, DataRef& result) override {
    interference->Interfere();
    if (interference->OneIn(5)) return false;
    result.Create(toType, "ab=c", 4);
    return true;
  }

 private:
  Interference*& interference;
};

}  // namespace

int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const PlugInRun run;
  Choices choices(data, size);
  Interference* current = nullptr;
  const InterferingCoercion coercion(current);
  Interference interference(choices, run.Handle());
  current = &interference;
  while (!choices.AtEnd()) interference.Step();
  return 0;
}
