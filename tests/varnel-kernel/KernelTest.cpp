// The embedded kernel through its C interface: what a walk over its operations does not reach.
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <functional>
#include <future>
#include <string>
#include <thread>
#include <vector>

#include "platform/SharedLibrary.h"
#include "tests/AllocationMeter.h"
#include "tests/Runtime.h"
#include "varnel-kernel/VarnelKernelHost.h"

namespace {

using std::string_literals::operator""s;

VRKHostLiveCounts Live() {
  VRKHostLiveCounts counts{};
  EXPECT_EQ(VRKHostGetLiveCounts(&counts), 0u);
  return counts;
}

VRKToken Token(const std::string& text) {
  VRKToken token{};
  EXPECT_EQ(VRKTokenCreate(text.c_str(), 0, &token), 0u);
  return token;
}

VRKData MakeData(const std::string& type, const std::string& bytes) {
  VRKData data{};
  EXPECT_EQ(VRKDataCreate(Token(type), bytes.data(), static_cast<uint32_t>(bytes.size()), 0, &data), 0u);
  return data;
}

// Callbacks that run whatever the test gave them as context.
using OnMessage = std::function<VRKResult()>;
using OnTrace = std::function<void(const VRKHostTraceCall&)>;

VRKResult VRK_CALL RunMessage(VRKObject, VRKToken, VRKDictionary, void* context) {
  return (*static_cast<OnMessage*>(context))();
}
VRKResult VRK_CALL RunTrace(const VRKHostTraceCall* call, void* context) {
  (*static_cast<OnTrace*>(context))(*call);
  return 0;
}

void Install(VRKObject object, OnMessage& handler, const char* message) {
  const VRKToken token = Token(message);
  VRKMessageHandler registration{};
  EXPECT_EQ(VRKMessageHandlerInstall(object, 0, RunMessage, &handler, 0, 0, &registration), 0u);
  EXPECT_EQ(VRKMessageHandlerAddMessages(registration, &token, 1), 0u);
}

// Starts a kernel for each test, and ends it with nothing alive.
class Kernel : public testing::Test {
 protected:
  void SetUp() override { ASSERT_EQ(VRKHostStart(), 0u); }
  void TearDown() override {
    VRKHostLiveCounts left{};
    const VRKHostLiveCounts none{};
    EXPECT_EQ(VRKHostShutDown(&left), 0u);
    EXPECT_EQ(std::memcmp(&left, &none, sizeof left), 0);
  }
};

TEST_F(Kernel, ReleasesNestsThatAreDeeperThanTheStack) {
  VRKData inner = MakeData("type:test", "");
  for (int level = 0; level < 200000; ++level) {
    VRKList list{};
    VRKData outer{};
    ASSERT_EQ(VRKHostListCreate(&list) | VRKHostListAppend(list, inner) | VRKHostListDataCreate(list, &outer), 0u);
    VRKDataRelease(inner);
    VRKListRelease(list);
    inner = outer;
  }
  VRKDataRelease(inner);
}

TEST_F(Kernel, CoercesTextEveryWay) {
  struct {
    const char *from, *to;
    std::string bytes, coerced;
  } const cases[] = {
      {"utf8", "utf16le", "a\xE2\x82\xAC\xF0\x9F\x98\x80"s, "a\0\xAC\x20\x3D\xD8\x00\xDE"s},
      {"utf8", "utf16be", "a\xE2\x82\xAC"s, "\0a\x20\xAC"s},
      {"utf8", "utf16", "\xEF\xBB\xBFx"s, "\xFF\xFEx\0"s},
      {"utf8", "utf16le", "\x80\xE2\x82z\0"s, "\xFD\xFF\xFD\xFFz\0\0\0"s},
      {"utf8", "utf16le", "", ""},
      {"utf8", "utf16", "", "\xFF\xFE"},
      {"utf16", "utf8", "\xFF\xFEx\0"s, "x"},
      {"utf16", "utf8", "\xFE\xFF\0x"s, "x"},
      {"utf16", "utf16le", "x\0"s, "x\0"s},
      {"utf16", "utf16be", "\xFF\xFE\xFF\xFE"s, "\xFE\xFF"s},
      {"utf16le", "utf8", "\x3D\xD8x\0\x00\xDE\x3D\xD8"s, "\xEF\xBF\xBDx\xEF\xBF\xBD\xEF\xBF\xBD"},
      {"utf16le", "utf16be", "\xFF\xFE\x3D\xD8"s, "\xFE\xFF\xFF\xFD"s},
      {"utf16be", "utf16", "\x20\xAC\x20"s, "\xFF\xFE\xAC\x20\xFD\xFF"s},
      {"utf16be", "utf8", "\0x\x20\xAC"s, "x\xE2\x82\xAC"s},
      {"utf16", "utf16", "\x3D\xD8x"s, "\x3D\xD8x"s},
  };
  for (const auto& each : cases) {
    SCOPED_TRACE(&each - cases);
    const VRKData source = MakeData("type:orvane.vrk."s + each.from, each.bytes);
    VRKData coerced{};
    const void* bytes = nullptr;
    uint32_t count = 0;
    ASSERT_EQ(VRKDataCoerce(source, Token("type:orvane.vrk."s + each.to), &coerced), 0u);
    EXPECT_EQ(VRKDataGetData(coerced, &bytes, &count, nullptr), 0u);
    EXPECT_EQ(std::string(static_cast<const char*>(bytes), count), each.coerced);
    VRKDataRelease(coerced);
    VRKDataRelease(source);
  }
}

TEST_F(Kernel, FreesNoBlockOfACallThatWasRefused) {
  void* block = nullptr;
  ASSERT_EQ(VRKMemoryAllocate(8, 0, &block), 0u);
  std::vector<uint32_t> blocksTold;
  OnTrace hook = [&](const VRKHostTraceCall&) { blocksTold.push_back(Live().memoryBlocks); };
  const auto refuse = [](const VRKHostTraceCall*, void*) -> VRKResult { return kVRKNotRunning; };
  ASSERT_EQ(VRKHostSetTraceHook(refuse, nullptr), 0u);
  EXPECT_EQ(VRKMemoryDeallocate(block), kVRKNotRunning);
  EXPECT_EQ(Live().memoryBlocks, 1u);
  ASSERT_EQ(VRKHostSetTraceHook(RunTrace, &hook), 0u);
  EXPECT_EQ(VRKMemoryDeallocate(block), 0u);
  EXPECT_EQ(blocksTold, (std::vector<uint32_t>{1, 0})) << "before the call and after it";
  ASSERT_EQ(VRKHostSetTraceHook(nullptr, nullptr), 0u);
}

TEST_F(Kernel, KeepsAMessageThatWasAskedForAgainOnce) {
  const VRKToken message = Token("message:m");
  VRKObject object{};
  VRKMessageHandler registration{};
  ASSERT_EQ(VRKObjectCreate(VRKToken{}, VRKDictionary{}, &object), 0u);
  OnMessage none = [] { return kVRKNotHandled; };
  ASSERT_EQ(VRKMessageHandlerInstall(object, 0, RunMessage, &none, 0, 0, &registration), 0u);
  ASSERT_EQ(VRKMessageHandlerAddMessages(registration, &message, 1), 0u);
  const AllocationMeter meter;
  for (int i = 0; i < 1000; ++i) ASSERT_EQ(VRKMessageHandlerAddMessages(registration, &message, 1), 0u);
  EXPECT_EQ(meter.TotalBytes(), 0u);
  VRKObjectRelease(object);
}

// Tokens count up, so that one without a text is known.
TEST_F(Kernel, KeepsNoTextThatGotNoToken) {
  auto next = static_cast<uint32_t>(Token("text:0"));
  uint32_t failures = 0;
  for (int i = 1; i < 200; ++i) {
    const std::string text = "text:" + std::to_string(i);
    VRKToken token{};
    ++next;
    for (size_t fault = 1; token == VRKToken{}; ++fault) {
      const AllocationMeter meter(fault);
      if (VRKTokenCreate(text.c_str(), 0, &token) == 0) continue;
      EXPECT_EQ(VRKTokenGetString(VRKToken{next}), nullptr);
      ++failures;
    }
    EXPECT_EQ(token, VRKToken{next});
  }
  EXPECT_EQ(failures > 3, kLibrariesShareRuntime);
}

TEST_F(Kernel, RunsOutOfHandlesAndHasThemAgain) {
  const VRKToken type = Token("type:test");
  for (int round = 0; round < 2; ++round) {
    std::vector<VRKData> live;
    live.reserve(4'194'304);
    VRKResult result = 0;
    {
      const AllocationMeter meter(0, 64 * 1024);  // no call moves all that live
      for (VRKData data{}; (result = VRKDataCreate(type, "", 0, 0, &data)) == 0;) live.push_back(data);
    }
    EXPECT_EQ(result, VRKResult{kVRKOutOfMemory});
    EXPECT_GE(live.size(), 4'194'303u - 1024);
    for (const VRKData each : live) ASSERT_EQ(VRKDataRelease(each), 0u);
  }
}

TEST_F(Kernel, TracesCallsWithTheirArguments) {
  std::vector<std::string> calls;
  OnTrace hook = [&](const VRKHostTraceCall& call) {
    std::string line = std::string(2 * call.depth, ' ') + call.operation;
    for (uint32_t i = 0; i < call.argumentCount; ++i) {
      const VRKHostTraceArgument& each = call.arguments[i];
      line += each.isOut != 0 ? " >" : " ";
      if (each.kind == kVRKTraceText)
        line += static_cast<const char*>(each.pointer);
      else if (each.kind == kVRKTraceToken && each.number != 0)
        line += VRKTokenGetString(VRKToken{each.number});
      else
        line += std::to_string(each.kind) + ':' + (each.number > 1 ? "n" : std::to_string(each.number));
    }
    calls.push_back(line + (call.isFinished != 0 ? " =" + std::to_string(call.result) : ""));
  };
  const VRKToken message = Token("message:m");
  VRKToken again{};
  VRKObject object{};
  OnMessage asks = [] { return VRKObjectRetain(VRKObject{}) + 4711; };
  ASSERT_EQ(VRKHostSetTraceHook(RunTrace, &hook), 0u);
  EXPECT_EQ(VRKObjectCreate(VRKToken{}, VRKDictionary{}, &object), 0u);
  EXPECT_EQ(VRKTokenCreate("message:m", 0, &again), 0u);
  ASSERT_EQ(VRKHostSetTraceHook(nullptr, nullptr), 0u);
  Install(object, asks, "message:m");
  ASSERT_EQ(VRKHostSetTraceHook(RunTrace, &hook), 0u);
  EXPECT_EQ(VRKObjectDeliverMessage(object, message, VRKDictionary{}, 1), 4711u);
  ASSERT_EQ(VRKHostSetTraceHook(nullptr, nullptr), 0u);
  const std::vector<std::string> expected = {"VRKObjectCreate 5:0 8:0 >3:0",
                                             "VRKObjectCreate 5:0 8:0 >3:n =0",
                                             "VRKTokenCreate message:m 0:0 >5:0",
                                             "VRKTokenCreate message:m 0:0 >message:m =0",
                                             "VRKObjectDeliverMessage 3:n message:m 8:0 0:1",
                                             "  VRKObjectRetain 3:0",
                                             "  VRKObjectRetain 3:0 =0",
                                             "VRKObjectDeliverMessage 3:n message:m 8:0 0:1 =4711"};
  EXPECT_EQ(calls, expected);
  VRKObjectRelease(object);
}

TEST_F(Kernel, ReportsFailedChecksOncePerSite) {
  uint32_t once = 0;
  const auto report = [&] { return VRKRuntimeError(2, "domain", "a == b", 0, "file", 12, "function", &once); };
  testing::internal::CaptureStderr();
  EXPECT_EQ(report() + report(), 0u);
  EXPECT_EQ(testing::internal::GetCapturedStderr(), "file:12: function: check failed: a == b [domain]\n");
  EXPECT_EQ(once, 1u);
}

// A copy of the library that calls the kernel as it is loaded, so that it is loaded anew.
std::string EagerCopy() {
  static std::atomic<int> count = 0;
  const std::string copy = EAGER_PLUG_IN "." + std::to_string(++count);
  std::filesystem::copy_file(EAGER_PLUG_IN, copy, std::filesystem::copy_options::overwrite_existing);
  return copy;
}

VRKPlugIn LoadEager() {
  VRKPlugIn plugIn{};
  EXPECT_EQ(VRKHostPlugInLoad(EagerCopy().c_str(), "Eager", &plugIn), 0u) << VRKHostLoadError();
  EXPECT_EQ(VRKHostSetTraceHook(nullptr, nullptr) + VRKHostSetErrorReporter(nullptr, nullptr), 0u);
  return plugIn;
}

// Threads that wait for each other cannot be joined, so that ends the run.
void ExitUnlessDone(const std::future<void>& done) {
  if (done.wait_for(std::chrono::seconds(20)) == std::future_status::ready) return;
  std::fputs("Two threads wait for each other\n", stderr);
  std::_Exit(1);
}

// The constructor of the eager library pauses before it calls the kernel, so that the other thread's
// call begins while the loader is locked.
TEST_F(Kernel, ServesLibrariesThatCallItAsTheyAreLoaded) {
  const VRKPlugIn plugIn = LoadEager();
  const std::function<VRKResult()> operations[] = {[] { return VRKHostPlugInUnload(LoadEager()); },
                                                   [=] { return VRKHostPlugInInitialize(plugIn); },
                                                   [=] { return VRKHostPlugInTerminate(plugIn); }};
  for (const auto& operation : operations) {
    auto loading = std::async(std::launch::async, [] { EXPECT_EQ(VRKHostPlugInUnload(LoadEager()), 0u); });
    auto operating = std::async(std::launch::async, [&] {
      std::this_thread::sleep_for(std::chrono::milliseconds(20));
      EXPECT_EQ(operation(), 0u);
    });
    ExitUnlessDone(loading);
    ExitUnlessDone(operating);
  }
  EXPECT_EQ(VRKHostPlugInUnload(plugIn), 0u);
}

TEST_F(Kernel, KeepsARefusedLibraryWhoseCodeItCalls) {
  VRKPlugIn plugIn{};
  EXPECT_EQ(VRKHostPlugInLoad(EagerCopy().c_str(), "Other", &plugIn), kVRKNotFound);
  Token("text:test");  // the library's hook is called
  EXPECT_EQ(VRKHostPlugInLoad(EagerCopy().c_str(), "Other", &plugIn), kVRKNotFound);
  ASSERT_EQ(VRKHostSetTraceHook(nullptr, nullptr), 0u);
  EXPECT_EQ(VRKRuntimeError(2, "", "", 0, "", 0, "", nullptr), 0u) << "by the library's reporter";
}

TEST_F(Kernel, TellsOfLoadErrorsInCallbacksBesideALoad) {
  VRKObject object{};
  ASSERT_EQ(VRKObjectCreate(VRKToken{}, VRKDictionary{}, &object), 0u);
  OnMessage asks = [] {
    std::this_thread::sleep_for(std::chrono::milliseconds(60));  // until the library calls the kernel
    return *VRKHostLoadError() == 0 ? kVRKNoError : kVRKInvalidArgument;
  };
  Install(object, asks, "message:m");
  const VRKToken message = Token("message:m");
  auto loading = std::async(std::launch::async, [] { EXPECT_EQ(VRKHostPlugInUnload(LoadEager()), 0u); });
  auto asking = std::async(std::launch::async, [&] {
    std::this_thread::sleep_for(std::chrono::milliseconds(20));  // the load has begun
    EXPECT_EQ(VRKObjectDeliverMessage(object, message, VRKDictionary{}, 1), 0u);
  });
  ExitUnlessDone(loading);
  ExitUnlessDone(asking);
  VRKObjectRelease(object);
}

VRKPlugIn LoadPlugIn(const std::string& whatItLeaves) {
  VRKPlugIn plugIn{};
  EXPECT_EQ(VRKHostPlugInLoad(TEST_PLUG_IN, "Test", &plugIn), 0u) << VRKHostLoadError();
  std::string reason;
  const platform::SharedLibrary library = platform::LoadSharedLibrary(TEST_PLUG_IN, reason);
  reinterpret_cast<void (*)(const char*)>(platform::FindFunction(library, "TestLeave"))(whatItLeaves.c_str());
  platform::UnloadSharedLibrary(library);
  return plugIn;
}

TEST_F(Kernel, RefusesWhatIsNoPlugIn) {
  VRKPlugIn plugIn{};
  EXPECT_EQ(VRKHostPlugInLoad("/none/such", "Test", &plugIn), kVRKNotFound);
  EXPECT_NE(std::string(VRKHostLoadError()).find("/none/such"), std::string::npos);
  EXPECT_EQ(VRKHostPlugInLoad(TEST_PLUG_IN, "Other", &plugIn), kVRKNotFound);
  EXPECT_EQ(VRKHostLoadError(), "it has no entry point OtherInitialize"s);
  const VRKData data = MakeData("type:test", "");
  for (const VRKPlugIn bad : {VRKPlugIn{}, VRKPlugIn{uint32_t(data)}, VRKPlugIn{0xFFFFFFFF}}) {
    uint32_t version = 0;
    EXPECT_EQ(VRKHostPlugInInitialize(bad), kVRKInvalidHandle);
    EXPECT_EQ(VRKHostPlugInTerminate(bad), kVRKInvalidHandle);
    EXPECT_EQ(VRKHostPlugInVersion(bad, &version), kVRKInvalidHandle);
    EXPECT_EQ(VRKHostPlugInUnload(bad), kVRKInvalidHandle);
  }
  VRKDataRelease(data);
}

TEST_F(Kernel, UnloadsPlugInsThatLeaveNothingBehind) {
  for (const std::string leaves : {"", "factory", "coercion", "handler"}) {
    SCOPED_TRACE(leaves);
    const uint32_t isStuck = leaves.empty() ? 0 : 1, everlasting = leaves == "handler" ? 1 : 0;
    const VRKPlugIn plugIn = LoadPlugIn(leaves);
    uint32_t version = 0;
    EXPECT_EQ(VRKHostPlugInVersion(plugIn, &version), 0u);
    EXPECT_EQ(version, 0x00020003u);
    EXPECT_EQ(VRKHostPlugInInitialize(plugIn), 0u);
    EXPECT_EQ(Live().objects, 1 + everlasting);
    EXPECT_EQ(VRKHostPlugInTerminate(plugIn), 0u);
    EXPECT_EQ(Live().objects, everlasting);
    EXPECT_EQ(VRKHostPlugInUnload(plugIn), isStuck != 0 ? kVRKInUse : kVRKNoError);
    EXPECT_NE(VRKHostPlugInUnload(plugIn), 0u);
    VRKHostLiveCounts left{};
    EXPECT_EQ(VRKHostShutDown(&left), 0u);
    EXPECT_EQ(left.plugIns, isStuck);
    EXPECT_EQ(left.objectFactories + left.dataCoercions + left.messageHandlers, isStuck);
    ASSERT_EQ(VRKHostStart(), 0u);
  }
}

TEST_F(Kernel, DrivesPlugInsFromWithinOtherCodeOnly) {
  const VRKPlugIn plugIn = LoadPlugIn("");
  VRKObject other{};
  ASSERT_EQ(VRKObjectCreate(VRKToken{}, VRKDictionary{}, &other), 0u);
  OnMessage restarts = [&] { return VRKHostPlugInInitialize(plugIn) + VRKHostPlugInTerminate(plugIn); };
  Install(other, restarts, "message:m");
  EXPECT_EQ(VRKObjectDeliverMessage(other, Token("message:m"), VRKDictionary{}, 1), 0u);
  VRKObjectRelease(other);

  VRKObject kept{};
  OnTrace notesObjects = [&](const VRKHostTraceCall& call) {
    if (call.isFinished && call.operation == "VRKObjectCreate"s) kept = VRKObject{call.arguments[2].number};
  };
  ASSERT_EQ(VRKHostSetTraceHook(RunTrace, &notesObjects), 0u);
  EXPECT_EQ(VRKHostPlugInInitialize(plugIn), 0u);
  ASSERT_EQ(VRKHostSetTraceHook(nullptr, nullptr), 0u);
  std::vector<VRKResult> inner;
  OnMessage drives = [&]() -> VRKResult {
    inner = {VRKHostPlugInInitialize(plugIn), VRKHostPlugInTerminate(plugIn), VRKHostPlugInUnload(plugIn)};
    return 0;
  };
  Install(kept, drives, "message:orvane.vrk.object-died");
  EXPECT_EQ(VRKHostPlugInUnload(plugIn), 0u);  // without terminate
  EXPECT_EQ(inner, std::vector<VRKResult>(3, kVRKInUse));
}

}  // namespace
