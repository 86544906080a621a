#include "tests/wrapper-framework/Support.h"

#include <map>
#include <utility>

#include "wrapper-framework/source/Boundary.h"

std::string Alive() {
  VRKHostLiveCounts live{};
  EXPECT_EQ(VRKHostGetLiveCounts(&live), 0u);
  const std::pair<const char*, uint32_t> kinds[] = {{"objects", live.objects},
                                                    {"handlers", live.messageHandlers},
                                                    {"factories", live.objectFactories},
                                                    {"coercions", live.dataCoercions},
                                                    {"data", live.data},
                                                    {"lists", live.lists},
                                                    {"dictionaries", live.dictionaries},
                                                    {"blocks", live.memoryBlocks}};
  std::string text;
  for (const auto& [kind, count] : kinds) {
    if (count != 0) text += std::string(kind) + ' ' + std::to_string(count) + ' ';
  }
  return text;
}

KernelTest::~KernelTest() {
  EXPECT_EQ(Alive(), "");
  EXPECT_EQ(VRKHostShutDown(nullptr), 0u);
}

CallTrace::CallTrace() {
  EXPECT_EQ(VRKHostSetTraceHook(&Hook, this), 0u);
}

CallTrace::~CallTrace() {
  VRKHostSetTraceHook(nullptr, nullptr);
  for (const auto& again : makeGood) again();
}

std::vector<std::string> CallTrace::Take() {
  std::erase_if(calls, [](const std::string& call) { return call.ends_with("Retain 0") || call.ends_with("Release 0"); });
  return std::exchange(calls, {});
}

VRKResult VRK_CALL CallTrace::Hook(const VRKHostTraceCall* call, void* context) {
  return call->isFinished != 0 ? 0 : static_cast<CallTrace*>(context)->Note(*call);
}

VRKResult CallTrace::Note(const VRKHostTraceCall& call) {
  calls.emplace_back(call.operation);
  for (uint32_t i = 0; i < call.argumentCount; ++i) {
    const VRKHostTraceArgument& argument = call.arguments[i];
    if (argument.isOut != 0 || argument.kind == kVRKTraceText) continue;
    if (argument.kind != kVRKTracePointer) calls.back() += ' ' + std::to_string(argument.number);
  }
  if (!Strikes(call.operation)) return 0;
  if (auto again = Again(call)) makeGood.push_back(std::move(again));
  if (fault != nullptr && fault->times > fault->at) return kLaterFailure;
  failed = call.operation;
  return kFailure;
}

bool CallTrace::Strikes(const std::string& operation) {
  if (operation == failNext) return failNext.clear(), true;
  return fault != nullptr && !(fault->lasts && EndsRegistration(operation)) && fault->Strikes();
}

// Does later what a call is kept from giving up now.
std::function<void()> CallTrace::Again(const VRKHostTraceCall& call) {
  const uint32_t handle = call.arguments[0].number, object = call.argumentCount > 1 ? call.arguments[1].number : 0;
  const auto pointer = [&call](uint32_t i) { return i < call.argumentCount ? const_cast<void*>(call.arguments[i].pointer) : nullptr; };
  void *const first = pointer(0), *const second = pointer(1), *const third = pointer(2);
  const std::map<std::string, std::function<void()>> giveUps = {
      {"VRKDataRelease", [=] { VRKDataRelease(VRKData{handle}); }},
      {"VRKListRelease", [=] { VRKListRelease(VRKList{handle}); }},
      {"VRKDictionaryRelease", [=] { VRKDictionaryRelease(VRKDictionary{handle}); }},
      {"VRKObjectRelease", [=] { VRKObjectRelease(VRKObject{handle}); }},
      {"VRKMemoryDeallocate", [=] { VRKMemoryDeallocate(first); }},
      {"VRKMessageHandlerRemove", [=] { VRKMessageHandlerRemove(VRKMessageHandler{handle}, VRKObject{object}); }},
      {"VRKDataCoercionHandlerRemove", [=] { VRKDataCoercionHandlerRemove(AsCallback<VRKDataCoercionCallback>(first), second, 0, 0); }},
      {"VRKObjectFactoryUnregister", [=] { VRKObjectFactoryUnregister(0, AsCallback<VRKObjectFactoryCallback>(second), third); }}};
  const auto found = giveUps.find(call.operation);
  return found != giveUps.end() ? found->second : nullptr;
}

VRKResult CodeOf(const std::function<void()>& body) {
  return Varnel::AtBoundary({}, [&body]() -> VRKResult {
    body();
    return 0;
  });
}

std::set<VRKResult> ResultsOf(const std::string& failed, bool lasts, Hears hears) {
  if (failed.empty() || hears == Hears::kNothing) return {0};
  const VRKResult code = failed == "VRKMemoryAllocate" ? Varnel::kResultOutOfMemory : CallTrace::kFailure;
  if (!GivesUp(failed) && hears == Hears::kAll) return {code};
  std::set<VRKResult> results = {0};
  if (failed.ends_with("Release") || failed == "VRKMessageHandlerRemove" || hears == Hears::kSome) results.insert(code);
  if (lasts) results.insert({CallTrace::kLaterFailure, Varnel::kResultOutOfMemory});
  return results;
}

uint32_t Report::Note(uint32_t severity, const char* domain, const char* expression, const char* sourceFile, uint32_t line,
                      const char* function, uint32_t* onceFlag, void* context) {
  Report& report = *static_cast<Report*>(context);
  report.text = std::to_string(severity) + '|' + domain + '|' + expression + '|' + sourceFile + '|' + std::to_string(line) + '|' + function;
  ++report.count;
  report.flag = onceFlag;
  *onceFlag = report.flagToSet;
  return report.answer;
}
