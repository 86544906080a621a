#include "CheckedCalls.h"

Handle CheckedCalls::Odd() {
  const Handle once = model.ever.empty() ? 0 : model.ever[Below(65536) % model.ever.size()];
  const uint32_t how = Below(4);
  if (how == 1) return once;
  if (how == 2) return once ^ 1u << Below(32);
  return how == 3 ? Below(65536) << 16 | Below(65536) : 0;
}

// Mostly what a callback serves, or one of the latest.
Argument CheckedCalls::Pick(Kind kind, bool mayBeNull) {
  const bool isServed = !calls.empty() && OneIn(2);
  for (size_t i = 0; isServed && i < calls.back()->arguments.size(); ++i) {
    const Argument& each = calls.back()->arguments[i];
    if (each.kind == kind) return {kind, each.handle, mayBeNull};
  }
  if (OneIn(mayBeNull ? 4 : 64)) return {kind, 0, mayBeNull};
  if (OneIn(16)) return {kind, Odd(), mayBeNull};
  Handle picked = 0;
  uint32_t passed = Below(4);
  for (auto each = model.ever.rbegin(); each != model.ever.rend() && passed <= 4; ++each) {
    if (!model.Is(kind, *each)) continue;
    picked = *each;
    --passed;
  }
  return {kind, picked != 0 ? picked : Odd(), mayBeNull};
}

Argument CheckedCalls::PickToken(uint32_t first, uint32_t count) {
  if (!OneIn(32)) return {Kind::kToken, TokenOf(first + Below(count))};
  return {Kind::kToken, OneIn(2) ? Odd() : LastToken() + 1};
}

bool CheckedCalls::IsGood(const Argument& argument) const {
  if (argument.handle == 0) return argument.mayBeNull;
  if (argument.kind == Kind::kToken) return IsToken(argument.handle);
  return model.Is(argument.kind, argument.handle);
}

std::set<VRKResult> CheckedCalls::RefusalsOf(const Call& call) const {
  if (!model.isRunning && call.needsKernel) return {kVRKNotRunning};
  std::set<VRKResult> codes;
  for (const Argument& each : call.arguments) {
    if (!IsGood(each)) codes.insert(kVRKInvalidHandle);
  }
  if (call.lacksPointer) codes.insert(kVRKInvalidArgument);
  if (codes.empty() && call.begin) codes.insert(call.begin());
  codes.erase(kVRKNoError);
  return codes;
}

void CheckedCalls::Enter(Call& call) {
  call.isTraced = call.operation != nullptr && model.isRunning && hook != 0 && !isInHook;
  call.failAt = std::exchange(failAt, 0);
  calls.push_back(&call);
  if (!call.isTraced) Begin();
}

// At the moment at which the kernel is to judge the arguments.
void CheckedCalls::Begin() {
  Call& call = *calls.back();
  call.codes = RefusalsOf(call);
  if (call.failAt != 0) meter.emplace(call.failAt);
}

// Nothing fails that the walk itself allocates.
void CheckedCalls::Disarm() {
  if (!meter) return;
  calls.back()->hasFailed = meter->Failed();
  meter.reset();
}

void CheckedCalls::Leave(Call& call, VRKResult result) {
  Disarm();
  calls.pop_back();
  const bool wasRefused = !call.codes.empty();
  if (!wasRefused && call.finish) call.codes.insert(call.finish());
  if (!wasRefused && call.hasFailed) call.codes.clear();
  if (call.hasFailed) call.codes.insert(kVRKOutOfMemory);
  if (call.codes.empty()) call.codes.insert(kVRKNoError);
  Require(call.codes.contains(result), call.operation != nullptr ? call.operation : "VRKHost");
  Require(call.isEntered == call.isTraced, "a call is traced");
  Require(call.isLeft == (call.isTraced && hook != 0), "and so is its end");
  Require(!call.isLeft || call.told == result, "with its result");
}

void CheckedCalls::Reenter() {
  if (depth == 4) return;
  ++depth;
  for (uint32_t left = Below(4); left != 0; --left) Step();
  --depth;
}

VRKResult CheckedCalls::Answer(VRKResult usual) {
  constexpr std::array<VRKResult, 5> kOdd = {kVRKCallbackThrew, 4711, kVRKOutOfMemory,
                                             kVRKNotHandled, kVRKCannotCoerce};
  return OneIn(4) ? kOdd[Below(kOdd.size())] : usual;
}

VRKResult CheckedCalls::OnTrace(const VRKHostTraceCall* told, void* context) {
  CheckedCalls& it = *current;
  if (it.isReading) return kVRKNoError;
  it.Disarm();
  Call& call = *it.calls.back();
  const auto isTraced = [](const Call* each) { return each->isTraced; };
  const auto depth = std::count_if(it.calls.begin(), it.calls.end(), isTraced) - 1;
  Require(reinterpret_cast<uintptr_t>(context) == it.hook, "the hook that is set");
  Require(call.isTraced && call.operation == std::string{told->operation}, "hears of the call");
  Require(told->depth == static_cast<size_t>(depth) && !it.isInHook, "and how deep it is nested");
  Require(call.isEntered == (told->isFinished != 0) && !call.isLeft, "before and after it runs");
  if (told->isFinished == 0) return Returned(it.HearOfStart(call));
  call.isLeft = true;
  call.told = told->result;
  return Returned(it.Answer(kVRKNoError));
}

VRKResult CheckedCalls::HearOfStart(Call& call) {
  call.isEntered = true;
  isInHook = true;
  Reenter();
  isInHook = false;
  const VRKResult answer = Answer(kVRKNoError);
  if (answer == kVRKNoError)
    Begin();
  else
    call.codes = {answer};
  return answer;
}
