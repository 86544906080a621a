// Several threads on one kernel. The thread sanitizer watches.
#include <gtest/gtest.h>

#include <string>
#include <thread>
#include <vector>

#include "VarnelKernelHost.h"

namespace {

VRKToken Token(const std::string& text) {
  VRKToken token{};
  EXPECT_EQ(VRKTokenCreate(text.c_str(), 0, &token), 0u);
  return token;
}

VRKResult VRK_CALL Count(VRKObject, VRKToken, VRKDictionary, void* context) {
  ++*static_cast<int*>(context);  // unprotected: the kernel serves one call at a time
  return kVRKNoError;
}

void CoerceText() {
  VRKData text{}, coerced{};
  const void* bytes = nullptr;
  uint32_t count = 0;
  EXPECT_EQ(VRKDataCreate(Token("type:orvane.vrk.utf8"), "text", 4, 0, &text), 0u);
  EXPECT_EQ(VRKDataCoerce(text, Token("type:orvane.vrk.utf16le"), &coerced), 0u);
  EXPECT_EQ(VRKDataGetData(coerced, &bytes, &count, nullptr), 0u);
  EXPECT_EQ(std::string(static_cast<const char*>(bytes), count), std::string("t\0e\0x\0t\0", 8));
  VRKDataRelease(coerced);
  VRKDataRelease(text);
}

void LiveAndDie(int& deaths) {
  VRKObject object{};
  VRKMessageHandler registration{};
  const VRKToken died = Token("message:orvane.vrk.object-died");
  EXPECT_EQ(VRKObjectCreate(VRKToken{}, VRKDictionary{}, &object), 0u);
  EXPECT_EQ(VRKMessageHandlerInstall(object, 0, Count, &deaths, 0, 0, &registration), 0u);
  EXPECT_EQ(VRKMessageHandlerAddMessages(registration, &died, 1), 0u);
  EXPECT_EQ(VRKObjectRelease(object), 0u);
}

TEST(Threads, ShareOneKernel) {
  constexpr int kThreads = 4;
  constexpr int kRounds = 3000;
  ASSERT_EQ(VRKHostStart(), 0u);
  int messages = 0;
  int deaths = 0;
  VRKObject shared{};
  VRKMessageHandler registration{};
  const VRKToken message = Token("message:m");
  VRKObjectCreate(VRKToken{}, VRKDictionary{}, &shared);
  VRKMessageHandlerInstall(shared, 0, Count, &messages, 0, 0, &registration);
  VRKMessageHandlerAddMessages(registration, &message, 1);
  const auto work = [&](int number) {
    for (int i = 0; i < kRounds; ++i) {
      CoerceText();
      LiveAndDie(deaths);
      Token("message:" + std::to_string(number) + std::to_string(i % 50));
      EXPECT_EQ(VRKObjectDeliverMessage(shared, message, VRKDictionary{}, 1), 0u);
    }
  };
  std::vector<std::thread> threads;
  for (int number = 0; number < kThreads; ++number) threads.emplace_back(work, number);
  for (std::thread& thread : threads) thread.join();
  VRKObjectRelease(shared);
  EXPECT_EQ(messages, kThreads * kRounds);
  EXPECT_EQ(deaths, kThreads * kRounds);
  VRKHostLiveCounts left{};
  EXPECT_EQ(VRKHostShutDown(&left), 0u);
  EXPECT_EQ(left.objects + left.messageHandlers + left.data, 0u);
}

}  // namespace
