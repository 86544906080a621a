#include "fuzz/varnel-kernel/CheckedCalls.h"

#include <cstring>

namespace {

// Throws instead of returning that it threw.
VRKResult Returned(VRKResult result) {
  if (kLibrariesShareRuntime && result == kVRKCallbackThrew) throw result;
  return result;
}

}  // namespace

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
  std::vector<Handle>& latest = model.latest[static_cast<size_t>(kind)];
  std::erase_if(latest, [&](Handle each) { return !model.Is(kind, each); });
  if (OneIn(16) || latest.empty()) return {kind, Odd(), mayBeNull};
  return {kind, latest[latest.size() - 1 - Below(5) % latest.size()], mayBeNull};
}

Argument CheckedCalls::PickToken(uint32_t first, uint32_t count) {
  const Handle token = TokenOf(first + Below(count));
  if (!OneIn(32)) return {Kind::kToken, token};
  return {Kind::kToken, OneIn(2) ? Odd() : token + 1};
}

bool CheckedCalls::IsGood(const Argument& argument) const {
  if (argument.handle == 0) return argument.mayBeNull;
  if (argument.kind == Kind::kToken) return IsToken(argument.handle);
  return model.Is(argument.kind, argument.handle);
}

void CheckedCalls::Enter(Call& call) {
  const bool isHosts = call.operation.starts_with("VRKHost");
  call.isTraced = !isHosts && model.isRunning && hook != 0 && !isInHook;
  call.failAt = std::exchange(failAt, 0);
  calls.push_back(&call);
  if (!call.isTraced) Begin();
}

// At the moment at which the kernel is to judge the arguments.
void CheckedCalls::Begin() {
  Call& call = *calls.back();
  const auto isGood = [&](const Argument& each) { return IsGood(each); };
  const auto refuse = [&](VRKResult code) {
    if (code != kVRKNoError) call.refusals.push_back(code);
  };
  if (!model.isRunning && call.needsKernel) return refuse(kVRKNotRunning);
  if (!std::all_of(call.arguments.begin(), call.arguments.end(), isGood)) refuse(kVRKInvalidHandle);
  if (call.lacksPointer) refuse(kVRKInvalidArgument);
  if (call.refusals.empty()) refuse(call.begin());
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
  std::vector<VRKResult> expected = call.refusals;
  if (expected.empty()) {
    const VRKResult usual = call.finish();
    if (!call.hasFailed) expected = {usual};
  }
  if (call.hasFailed) expected.push_back(kVRKOutOfMemory);
  const bool isExpected = std::count(expected.begin(), expected.end(), result) != 0;
  Require(isExpected, call.operation.c_str());
  Require(call.heard == (call.isTraced ? 1u + (hook != 0) : 0), "a call is traced, and its end");
  Require(call.heard < 2 || call.told == result, "with its result");
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

VRKResult CheckedCalls::Serve(const Told& told, Kind makes, void* out) {
  CheckedCalls& it = *current;
  it.Disarm();
  Call& call = *it.calls.back();
  Require(call.next && call.refusals.empty(), "there is a reason to call");
  const Told expected = call.next(told);
  Require(expected.context != 0 && told.context == expected.context, "it is the callback's turn");
  Require(told.values == expected.values, "to be given this");
  it.Reenter();
  const VRKResult answer = it.Answer(it.OneIn(2) ? kVRKNoError : call.answer);
  call.answer = answer;
  if (out == nullptr) return Returned(answer);
  call.made = it.Pick(makes).handle;
  std::memcpy(out, &call.made, sizeof call.made);
  if (answer == kVRKNoError && !it.model.Is(makes, call.made)) call.answer = kVRKNoResult;
  return Returned(answer);
}

VRKResult CheckedCalls::OnTrace(const VRKHostTraceCall* told, void* context) {
  CheckedCalls& it = *current;
  if (it.isReading) return kVRKNoError;
  it.Disarm();
  Call& call = *it.calls.back();
  const auto isTraced = [](const Call* each) { return each->isTraced; };
  const auto depth = std::count_if(it.calls.begin(), it.calls.end(), isTraced) - 1;
  Require(reinterpret_cast<uintptr_t>(context) == it.hook, "the hook that is set");
  Require(call.isTraced && call.operation == told->operation, "hears of the call");
  Require(told->depth == static_cast<size_t>(depth) && !it.isInHook, "and how deep it is nested");
  Require(call.heard++ == told->isFinished, "before and after it runs");
  call.told = told->result;
  if (told->isFinished != 0) return Returned(it.Answer(kVRKNoError));
  it.isInHook = true;
  it.Reenter();
  it.isInHook = false;
  const VRKResult answer = it.Answer(kVRKNoError);
  if (answer != kVRKNoError) call.refusals = {answer};
  if (answer == kVRKNoError) it.Begin();
  return Returned(answer);
}
