// Anything, from anywhere: a host's trace hook, its error reporter and its coercion, which fail at
// times, take steps of their own in the middle of others, and tell of deaths that are none. No
// model could follow: what counts is that nothing is reached that is gone, and nothing left over.
#include <string_view>
#include <utility>

#include "fuzz/Choices.h"
#include "fuzz/kolvane/source/PlugInRun.h"
#include "kolvane/api/wrapper-framework/VRKStringTranslatorProtocol.h"
#include "tests/kolvane/source/Messages.h"
#include "tests/wrapper-framework/Operations.h"
#include "wrapper-framework/source/DataCoercion.h"

namespace {

using namespace Varnel;

constexpr int kMostNesting = 3;
constexpr size_t kMostObjects = 20;
constexpr VRKResult kFailure = 4242;
constexpr char kTypeWalk[] = "type:walk";

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
  void Step() noexcept {
    try {
      TakeStep();
    } catch (...) {
    }
  }

  void Interfere() {
    if (depth > kMostNesting) return;
    ++depth;
    for (uint32_t i = choices.Below(3); i > 0; --i) Step();
    --depth;
  }

  bool OneIn(uint32_t count) { return choices.OneIn(count); }

 private:
  static VRKResult VRK_CALL Hook(const VRKHostTraceCall* call, void* context) {
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

  static uint32_t VRK_CALL Report(uint32_t, const char*, const char*, const char*, uint32_t,
                                  const char*, uint32_t* onceFlag, void* context) {
    auto& self = *static_cast<Interference*>(context);
    self.Interfere();
    *onceFlag = self.OneIn(2) ? 0 : 1;
    return 0;
  }

  void TakeStep() {
    const uint32_t kind = choices.Below(16);
    if (kind < 4) return objects.size() < kMostObjects ? Create() : Release();
    if (kind < 6) return Release();
    if (kind < 8) return SendTo(kMessageMakeDefault, {});
    if (kind < 10) {
      const DataRef image = RandomData("\"$$$/k=v\"\n\"$$$/n=tralala\"\n");
      return SendTo(kMessageSetTranslations, With(kParameterTranslations, image));
    }
    if (kind < 13) {
      const DataRef key = RandomData("$$$/k=x");
      return SendTo(kMessageTranslateString, With(kParameterTranslationKey, key));
    }
    if (kind < 14) return Coerce();
    if (kind < 15) return SendTo("message:orvane.vrk.object-died", {});
    static_cast<void>(choices.OneIn(4) ? VRKHostPlugInTerminate(plugIn)
                                       : VRKHostPlugInInitialize(plugIn));
  }

  void Create() {
    const char* const name =
        choices.OneIn(2) ? kClassStringTranslator : kClassDefaultStringTranslator;
    const DictionaryRef parameters =
        choices.OneIn(2) ? With("parameter:walk", RandomData("x")) : DictionaryRef();
    VRKObject object{};
    VRKObjectCreate(MakeToken(name), parameters.Get(), &object);
    if (object != VRKObject{}) objects.push_back(object);
  }

  void Release() {
    if (objects.empty()) return;
    std::swap(objects.back(), objects[choices.Below(static_cast<uint32_t>(objects.size()))]);
    const VRKObject released = objects.back();
    objects.pop_back();
    VRKObjectRelease(released);
  }

  void Coerce() {
    const char* const types[] = {kTypeUTF8, kTypeUTF16LE, kTypeUTF16BE, kTypeUTF16};
    DataRef coerced;
    RandomData("$$$/k=x").Coerce(MakeToken(types[choices.Below(4)]), coerced);
  }

  void SendTo(const char* message, const DictionaryRef& parameters) {
    const bool toLatest = objects.empty() || choices.OneIn(4);
    const VRKObject receiver =
        toLatest ? latest : objects[choices.Below(static_cast<uint32_t>(objects.size()))];
    Send(receiver, message, parameters);
  }

  DataRef RandomData(const std::string& text) {
    const char* const types[] = {kTypeUTF8, kTypeLocaleIndependentUTF8, kTypeWalk, kTypeUTF16LE,
                                 kTypeUTF16};
    return DataOf(types[choices.Below(5)], text);
  }

  Choices& choices;
  const VRKPlugIn plugIn;
  int depth = 0;
  std::vector<VRKObject> objects;
  VRKObject latest{};  // to which a handler was attached
};

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
