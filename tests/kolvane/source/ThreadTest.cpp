// Several threads on translators of one kernel, of which each is the default for a while and dies.
// The thread sanitizer watches.
#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <cstdio>
#include <string>
#include <thread>
#include <vector>

#include "Data.h"
#include "Holders.h"
#include "ResultCodes.h"
#include "Tokens.h"
#include "VRKStringTranslatorProtocol.h"
#include "VarnelKernelHost.h"

namespace {

using namespace Varnel;

constexpr int kThreads = 4;
constexpr int kRounds = 500;

struct Answer {
  VRKResult result;
  std::string text;
};

DataRef DataOf(const char* type, const std::string& bytes) {
  return MakeData(type, bytes.data(), static_cast<uint32_t>(bytes.size()));
}

std::string BytesOf(VRKData data) {
  const void* bytes = nullptr;
  uint32_t count = 0;
  EXPECT_EQ(VRKDataGetData(data, &bytes, &count, nullptr), 0u);
  return {static_cast<const char*>(bytes), count};
}

VRKResult Send(VRKObject to, const char* message, const char* parameter, const DataRef& data, DictionaryRef& parameters) {
  parameters.Create();
  if (parameter != nullptr) parameters.SetEntry(MakeToken(parameter), data);
  return VRKObjectDeliverMessage(to, MakeToken(message), parameters.Get(), 1);
}

// Without the zero that ends a translation; the framework's readers are for one thread.
Answer Coerced(const DataRef& key) {
  VRKData text{};
  const VRKResult result = VRKDataCoerce(key.Get(), MakeToken(kTypeUTF8), &text);
  if (result != 0) return {result, {}};
  DataRef held;
  held.Adopt(text);
  return {result, BytesOf(text).c_str()};
}

Answer Translated(VRKObject by, const std::string& key) {
  DictionaryRef parameters;
  const VRKResult result = Send(by, kMessageTranslateString, kParameterTranslationKey, DataOf(kTypeUTF8, key), parameters);
  if (result != 0) return {result, {}};
  return Coerced(parameters.GetEntry(MakeToken(kParameterMessageResult)));
}

// What one thread's translators are about: "thread N round R" is the translation of two keys.
class Worker {
 public:
  using Rounds = std::array<std::atomic<int>, kThreads>;

  Worker(int threadNumber, Rounds& roundsOfAll) : number(threadNumber), rounds(roundsOfAll) {}

  void Run() {
    for (int round = 0; round < kRounds; ++round) {
      rounds[static_cast<size_t>(number)] = round;
      Live(round);
    }
  }

 private:
  void Live(int round) {
    const std::string text = "thread " + std::to_string(number) + " round " + std::to_string(round);
    VRKObject object{};
    ASSERT_EQ(VRKObjectCreate(MakeToken(kClassStringTranslator), {}, &object), 0u);
    DictionaryRef parameters;
    for (const std::string& name : {"own" + std::to_string(number), std::string("shared")}) {
      const DataRef image = DataOf(kTypeUTF8, "\"$$$/" + name + "=" + text + "\"\n");
      EXPECT_EQ(Send(object, kMessageSetTranslations, kParameterTranslations, image, parameters), 0u);
    }
    if (round % 3 != 0) {
      EXPECT_EQ(Send(object, kMessageMakeDefault, nullptr, {}, parameters), 0u);
    }
    EXPECT_EQ(Translated(object, "$$$/own" + std::to_string(number) + "=none").text, text);
    EXPECT_EQ(Translated(object, "$$$/shared=none").text, text);
    const std::string other = "$$$/own" + std::to_string((number + 1) % kThreads) + "=none";
    CheckDefaults(Translated(object, other), "thread " + std::to_string((number + 1) % kThreads), false);
    CheckDefaults(Coerced(DataOf(kTypeLocaleIndependentUTF8, "$$$/shared=none")), "thread ", true);
    UseDefault();
    EXPECT_EQ(VRKObjectRelease(object), 0u);
  }

  void UseDefault() {
    VRKObject object{};
    const VRKResult result = VRKObjectCreate(MakeToken(kClassDefaultStringTranslator), {}, &object);
    CheckDefaults({result, "none"}, "thread ", true);
    if (result != 0) return;
    CheckDefaults(Translated(object, "$$$/shared=none"), "thread ", true);
    EXPECT_EQ(VRKObjectRelease(object), 0u);
  }

  // The default translator is dead, or does not know the key, or says what its thread had it say.
  void CheckDefaults(const Answer& answer, const std::string& start, bool mayBeDead) {
    if (mayBeDead && answer.result == kResultInvariantViolation) return;
    EXPECT_EQ(answer.result, 0u);
    if (answer.text == "none") return;
    ++known;
    size_t thread = kThreads;
    int round = 0;
    EXPECT_EQ(std::sscanf(answer.text.c_str(), "thread %zu round %d", &thread, &round), 2) << answer.text;
    EXPECT_TRUE(answer.text.starts_with(start)) << answer.text;
    ASSERT_LT(thread, rounds.size());
    EXPECT_LE(round, rounds[thread]);
  }

  const int number;
  Rounds& rounds;

 public:
  int known = 0;  // answers that came from a default translator
};

TEST(Threads, ShareTranslators) {
  ASSERT_EQ(VRKHostStart(), 0u);
  VRKPlugIn plugIn{};
  ASSERT_EQ(VRKHostPlugInLoad(PLUG_IN, "VRKKolvanes", &plugIn), 0u) << VRKHostLoadError();
  ASSERT_EQ(VRKHostPlugInInitialize(plugIn), 0u);
  Worker::Rounds rounds{};
  std::vector<Worker> workers;
  std::vector<std::thread> threads;
  workers.reserve(kThreads);
  for (int number = 0; number < kThreads; ++number) {
    Worker& worker = workers.emplace_back(number, rounds);
    threads.emplace_back([&worker] { worker.Run(); });
  }
  for (std::thread& thread : threads) thread.join();
  for (const Worker& worker : workers) EXPECT_GT(worker.known, kRounds / 10);
  EXPECT_EQ(VRKHostPlugInTerminate(plugIn), 0u);
  EXPECT_EQ(VRKHostPlugInUnload(plugIn), 0u);
  VRKHostLiveCounts left{};
  EXPECT_EQ(VRKHostShutDown(&left), 0u);
  EXPECT_EQ(left.objects + left.messageHandlers + left.data + left.dictionaries + left.memoryBlocks, 0u);
}

}  // namespace
