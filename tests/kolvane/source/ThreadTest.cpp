// Several threads on one kernel, and on translators of which each is the default for a while and dies.
// The thread sanitizer watches.
#include <gtest/gtest.h>

#include <string>
#include <thread>
#include <vector>

#include "kolvane/api/wrapper-framework/VRKStringTranslatorClient.h"
#include "kolvane/api/wrapper-framework/VRKStringTranslatorProtocol.h"
#include "tests/kolvane/source/Messages.h"
#include "varnel-kernel/VarnelKernelHost.h"
#include "wrapper-framework/source/Exceptions.h"
#include "wrapper-framework/source/ResultCodes.h"

namespace {

using namespace Varnel;

constexpr int kThreads = 4;
constexpr int kRounds = 1000;

VRKResult VRK_CALL Count(VRKObject, VRKToken, VRKDictionary, void* context) {
  ++*static_cast<int*>(context);  // unprotected: the kernel serves one call at a time
  return kVRKNoError;
}

ObjectRef NewObject(const char* objectClass) {
  ObjectRef object;
  object.Create(objectClass != nullptr ? MakeToken(objectClass) : VRKToken{}, {});
  return object;
}

ObjectRef CountingObject(const char* message, int& count) {
  ObjectRef object = NewObject(nullptr);
  VRKMessageHandler registration{};
  const VRKToken token = MakeToken(message);
  EXPECT_EQ(VRKMessageHandlerInstall(object.Get(), 0, Count, &count, 0, 0, &registration), 0u);
  EXPECT_EQ(VRKMessageHandlerAddMessages(registration, &token, 1), 0u);
  return object;
}

// One thread, whose translators make its name of two keys.
class Worker {
 public:
  explicit Worker(int number) : ownKey(KeyOf(number)), otherKey(KeyOf(number + 1)), name(NameOf(number)), otherName(NameOf(number + 1)) {}

  void Live(int round, VRKObject counting, int& deaths) {
    const auto translator = CreateStringTranslator();
    Load(*translator, "\"$$$/" + ownKey + "=" + name + "\"\n\"$$$/shared=" + name + "\"\n");
    if (round % 3 != 0) translator->MakeDefault();
    for (const std::string& key : {ownKey, std::string("shared")}) EXPECT_EQ(Translated(*translator, "$$$/" + key + "=none").c_str(), name);
    const std::string other = Translated(*translator, "$$$/" + otherKey + "=none").c_str();
    EXPECT_TRUE(other == otherName || other == "none") << other;
    AskDefault([] { return GetUTF8(DataOf(kTypeLocaleIndependentUTF8, "$$$/shared=none")); });
    AskDefault([] {
      StringTranslatorClient client;
      client.SetObject(NewObject(kClassDefaultStringTranslator));
      return Translated(client, "$$$/shared=none");
    });
    CountingObject("message:orvane.vrk.object-died", deaths);
    EXPECT_EQ(Send(counting, "message:test"), 0u);
    MakeToken((name + std::to_string(round % 50)).c_str());
  }

  int known = 0;  // answers that came from a default translator

 private:
  static std::string KeyOf(int number) { return "own" + std::to_string(number % kThreads); }
  static std::string NameOf(int number) { return "thread " + std::to_string(number % kThreads); }

  // The default translator is dead, or does not know the key, or says what its thread had it say.
  template <class Ask>
  void AskDefault(const Ask& ask) {
    try {
      const std::string answer = ask();
      EXPECT_TRUE(answer.starts_with("thread ") || answer.starts_with("none")) << answer;
      known += answer.starts_with("thread ");
    } catch (const Varnel::Exception& error) {
      EXPECT_EQ(error.GetResultCode(), kResultInvariantViolation);
    }
  }

  const std::string ownKey, otherKey, name, otherName;
};

TEST(Threads, ShareAKernelAndTranslators) {
  ASSERT_EQ(VRKHostStart(), 0u);
  VRKPlugIn plugIn{};
  ASSERT_EQ(VRKHostPlugInLoad(PLUG_IN, "VRKKolvanes", &plugIn), 0u) << VRKHostLoadError();
  ASSERT_EQ(VRKHostPlugInInitialize(plugIn), 0u);
  GetUTF8(MakeUTF16Data(nullptr, 0));  // the framework makes its own tokens on one thread
  int messages = 0, deaths = 0;
  {
    const ObjectRef counting = CountingObject("message:test", messages);
    std::vector<std::thread> threads;
    for (int number = 0; number < kThreads; ++number) {
      threads.emplace_back([&, number] {
        Worker worker(number);
        for (int round = 0; round < kRounds; ++round) worker.Live(round, counting.Get(), deaths);
        EXPECT_GT(worker.known, kRounds / 10);
      });
    }
    for (std::thread& thread : threads) thread.join();
  }
  EXPECT_EQ(messages, kThreads * kRounds);
  EXPECT_EQ(deaths, kThreads * kRounds);
  EXPECT_EQ(VRKHostPlugInTerminate(plugIn), 0u);
  EXPECT_EQ(VRKHostPlugInUnload(plugIn), 0u);
  VRKHostLiveCounts left{};
  EXPECT_EQ(VRKHostShutDown(&left), 0u);
  EXPECT_EQ(left.objects + left.messageHandlers + left.data + left.dictionaries + left.memoryBlocks, 0u);
}

}  // namespace
