// The cost of kernel calls, alone and while a second thread calls too.
#include <benchmark/benchmark.h>

#include <cstdlib>

#include "varnel-kernel/VarnelKernelHost.h"

namespace {

void Require(VRKResult result) {
  if (result != kVRKNoError) std::abort();
}

VRKToken Token(const char* text) {
  VRKToken token{};
  Require(VRKTokenCreate(text, 0, &token));
  return token;
}

constexpr char kText[] = "A text of thirty-two characters.";
constexpr uint32_t kTextSize = sizeof kText - 1;

VRKResult VRK_CALL Handle(VRKObject, VRKToken, VRKDictionary, void*) {
  return kVRKNoError;
}

void FindToken(benchmark::State& state) {
  for (auto _ : state) benchmark::DoNotOptimize(Token("message:orvane.vrk.object-died"));
}

void Deliver(benchmark::State& state) {
  const VRKToken message = Token("message:m");
  VRKObject object{};
  VRKMessageHandler registration{};
  Require(VRKObjectCreate(VRKToken{}, VRKDictionary{}, &object));
  Require(VRKMessageHandlerInstall(object, 0, Handle, nullptr, 0, 0, &registration));
  Require(VRKMessageHandlerAddMessages(registration, &message, 1));
  for (auto _ : state) Require(VRKObjectDeliverMessage(object, message, VRKDictionary{}, 1));
  VRKObjectRelease(object);
}

// Three calls.
void CreateReadReleaseData(benchmark::State& state) {
  const VRKToken type = Token("type:orvane.vrk.utf8");
  for (auto _ : state) {
    VRKData data{};
    const void* bytes = nullptr;
    Require(VRKDataCreate(type, kText, kTextSize, 0, &data));
    Require(VRKDataGetData(data, &bytes, nullptr, nullptr));
    benchmark::DoNotOptimize(bytes);
    Require(VRKDataRelease(data));
  }
}

// Two calls.
void SetGetEntry(benchmark::State& state) {
  const VRKToken key = Token("parameter:p");
  VRKDictionary dictionary{};
  VRKData data{}, found{};
  Require(VRKDictionaryCreate(0, &dictionary));
  Require(VRKDataCreate(key, kText, kTextSize, 0, &data));
  for (auto _ : state) {
    Require(VRKDictionarySetEntry(dictionary, key, data));
    Require(VRKDictionaryGetEntry(dictionary, key, &found));
  }
  VRKDataRelease(data);
  VRKDictionaryRelease(dictionary);
}

// Two calls: the coercion and the release of its result.
void Coerce(benchmark::State& state, const char* toType) {
  const VRKToken to = Token(toType);
  VRKData text{}, coerced{};
  Require(VRKDataCreate(Token("type:orvane.vrk.utf8"), kText, kTextSize, 0, &text));
  for (auto _ : state) {
    Require(VRKDataCoerce(text, to, &coerced));
    Require(VRKDataRelease(coerced));
  }
  VRKDataRelease(text);
}

BENCHMARK(FindToken)->ThreadRange(1, 2);
BENCHMARK(Deliver)->ThreadRange(1, 2);
BENCHMARK(CreateReadReleaseData)->ThreadRange(1, 2);
BENCHMARK(SetGetEntry)->ThreadRange(1, 2);
BENCHMARK_CAPTURE(Coerce, utf8_to_utf16le, "type:orvane.vrk.utf16le")->ThreadRange(1, 2);
BENCHMARK_CAPTURE(Coerce, utf8_to_itself, "type:orvane.vrk.utf8")->ThreadRange(1, 2);

}  // namespace

int main(int argc, char** argv) {
  Require(VRKHostStart());
  benchmark::Initialize(&argc, argv);
  if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 2;
  benchmark::RunSpecifiedBenchmarks();
  return 0;
}
