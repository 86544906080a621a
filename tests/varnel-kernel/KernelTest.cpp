// The embedded kernel through its C interface.
#include <gtest/gtest.h>
#include <pthread.h>

#include <algorithm>
#include <cstring>
#include <functional>
#include <map>
#include <random>
#include <stdexcept>
#include <string>
#include <vector>

#include "AllocationMeter.h"
#include "FromC.h"
#include "Runtime.h"
#include "SharedLibrary.h"
#include "VarnelKernelHost.h"

namespace {

using std::string_literals::operator""s;

bool operator==(const VRKHostLiveCounts& one, const VRKHostLiveCounts& other) {
  return std::memcmp(&one, &other, sizeof one) == 0;
}

VRKHostLiveCounts Live() {
  VRKHostLiveCounts counts{};
  EXPECT_EQ(VRKHostGetLiveCounts(&counts), 0u);
  return counts;
}

VRKToken Token(const char* text) {
  VRKToken token{};
  EXPECT_EQ(VRKTokenCreate(text, 0, &token), 0u);
  return token;
}

VRKData MakeData(const char* type, const std::string& bytes) {
  VRKData data{};
  EXPECT_EQ(VRKDataCreate(Token(type), bytes.data(), static_cast<uint32_t>(bytes.size()), 0, &data), 0u);
  return data;
}

std::string BytesOf(VRKData data) {
  const void* bytes = nullptr;
  uint32_t count = 0;
  EXPECT_EQ(VRKDataGetData(data, &bytes, &count, nullptr), 0u);
  return {static_cast<const char*>(bytes), count};
}

VRKObject PlainObject() {
  VRKObject object{};
  EXPECT_EQ(VRKObjectCreate(VRKToken{}, VRKDictionary{}, &object), 0u);
  return object;
}

// Callbacks that run whatever the test gave them as context.
using OnMessage = std::function<VRKResult(VRKObject, VRKToken)>;
using OnCreate = std::function<VRKResult(VRKDictionary, VRKObject*)>;
using OnCoerce = std::function<VRKResult(VRKData, VRKData*)>;
using OnTrace = std::function<VRKResult(const VRKHostTraceCall&)>;

VRKResult VRK_CALL RunMessage(VRKObject object, VRKToken message, VRKDictionary, void* context) {
  return (*static_cast<OnMessage*>(context))(object, message);
}
VRKResult VRK_CALL RunCreate(VRKToken, VRKDictionary parameters, void* context, VRKObject* out) {
  return (*static_cast<OnCreate*>(context))(parameters, out);
}
VRKResult VRK_CALL RunCoerce(VRKData data, VRKToken, VRKToken, void* context, VRKData* out) {
  return (*static_cast<OnCoerce*>(context))(data, out);
}
VRKResult VRK_CALL RunTrace(const VRKHostTraceCall* call, void* context) {
  return (*static_cast<OnTrace*>(context))(*call);
}

VRKMessageHandler Install(VRKObject object, OnMessage& handler, std::vector<const char*> messages) {
  VRKMessageHandler registration{};
  EXPECT_EQ(VRKMessageHandlerInstall(object, 0, RunMessage, &handler, 0, 0, &registration), 0u);
  for (const char* const message : messages) {
    const VRKToken token = Token(message);
    EXPECT_EQ(VRKMessageHandlerAddMessages(registration, &token, 1), 0u);
  }
  return registration;
}

VRKResult Deliver(VRKObject object, const char* message) {
  return VRKObjectDeliverMessage(object, Token(message), VRKDictionary{}, 1);
}

constexpr const char* kDied = "message:orvane.vrk.object-died";

// Starts a kernel for each test, and ends it with nothing alive.
class Kernel : public testing::Test {
 protected:
  void SetUp() override { ASSERT_EQ(VRKHostStart(), 0u); }
  void TearDown() override {
    VRKHostLiveCounts left{};
    EXPECT_EQ(VRKHostShutDown(&left), 0u);
    EXPECT_TRUE(left == expectedLeft);
  }

  VRKHostLiveCounts expectedLeft{};
};

// One of each kind of handle, as plain numbers.
struct Zoo {
  Zoo() {
    object = PlainObject();
    static OnMessage handler = [](VRKObject, VRKToken) { return VRKResult{kVRKNotHandled}; };
    registration = Install(object, handler, {});
    data = MakeData("type:test", "x");
    VRKHostListCreate(&list);
    VRKDictionaryCreate(0, &dictionary);
  }
  void Release() const {
    VRKDataRelease(data);
    VRKListRelease(list);
    VRKDictionaryRelease(dictionary);
    VRKObjectRelease(object);
  }
  std::vector<uint32_t> Numbers() const {
    return {uint32_t(object), uint32_t(registration), uint32_t(data), uint32_t(list), uint32_t(dictionary)};
  }

  VRKObject object{};
  VRKMessageHandler registration{};
  VRKData data{};
  VRKList list{};
  VRKDictionary dictionary{};
};

TEST_F(Kernel, RefusesEveryBadHandleInEveryOperation) {
  const Zoo live;
  const VRKToken token = Token("type:test");
  uint32_t number = 0;
  const void* bytes = nullptr;
  VRKObject object{};
  VRKMessageHandler registration{};
  VRKData data{};
  VRKList list{};
  // For each operation: the index in the zoo of the handle it takes (5: a token, 6: a plug-in), and whether it
  // takes null.
  struct {
    size_t kind;
    bool nullIsFine;
    std::function<VRKResult(uint32_t)> call;
  } const operations[] = {
      {5, true, [&](uint32_t h) { return VRKObjectCreate(VRKToken{h}, VRKDictionary{}, &object); }},
      {4, true, [&](uint32_t h) { return VRKObjectCreate(Token("class:none"), VRKDictionary{h}, &object); }},
      {0, false, [&](uint32_t h) { return VRKObjectDeliverMessage(VRKObject{h}, token, VRKDictionary{}, 1); }},
      {5, false, [&](uint32_t h) { return VRKObjectDeliverMessage(live.object, VRKToken{h}, VRKDictionary{}, 1); }},
      {4, true, [&](uint32_t h) { return VRKObjectDeliverMessage(live.object, token, VRKDictionary{h}, 1); }},
      {0, true, [&](uint32_t h) { return VRKObjectRetain(VRKObject{h}); }},
      {0, true, [&](uint32_t h) { return VRKObjectRelease(VRKObject{h}); }},
      {5, false, [&](uint32_t h) { return VRKObjectFactoryRegister(VRKToken{h}, 0, RunCreate, nullptr); }},
      {0, false, [&](uint32_t h) { return VRKMessageHandlerInstall(VRKObject{h}, 0, RunMessage, nullptr, 0, 0, &registration); }},
      {1, false, [&](uint32_t h) { return VRKMessageHandlerAddMessages(VRKMessageHandler{h}, &token, 1); }},
      {5, false,
       [&](uint32_t h) {
         const VRKToken forged{h};
         return VRKMessageHandlerAddMessages(live.registration, &forged, 1);
       }},
      {1, false, [&](uint32_t h) { return VRKMessageHandlerRemove(VRKMessageHandler{h}, live.object); }},
      {0, false, [&](uint32_t h) { return VRKMessageHandlerRemove(live.registration, VRKObject{h}); }},
      {5, false, [&](uint32_t h) { return VRKTokenGetString(VRKToken{h}) == nullptr ? 1u : 0u; }},
      {5, false, [&](uint32_t h) { return VRKDataCreate(VRKToken{h}, "x", 1, 0, &data); }},
      {5, false, [&](uint32_t h) { return VRKDataCreate(Token("type:orvane.vrk.token"), &h, 4, 0, &data); }},
      {3, false, [&](uint32_t h) { return VRKDataCreate(Token("type:orvane.vrk.list"), &h, 4, 0, &data); }},
      {4, false, [&](uint32_t h) { return VRKDataCreate(Token("type:orvane.vrk.dictionary"), &h, 4, 0, &data); }},
      {2, false, [&](uint32_t h) { return VRKDataGetData(VRKData{h}, &bytes, &number, nullptr); }},
      {2, false, [&](uint32_t h) { return VRKDataCoerce(VRKData{h}, token, &data); }},
      {5, false, [&](uint32_t h) { return VRKDataCoerce(live.data, VRKToken{h}, &data); }},
      {2, true, [&](uint32_t h) { return VRKDataRetain(VRKData{h}); }},
      {2, true, [&](uint32_t h) { return VRKDataRelease(VRKData{h}); }},
      {5, false, [&](uint32_t h) { return VRKDataCoercionHandlerInstall(VRKToken{h}, token, 0, RunCoerce, nullptr); }},
      {5, false, [&](uint32_t h) { return VRKDataCoercionHandlerInstall(token, VRKToken{h}, 0, RunCoerce, nullptr); }},
      {4, false, [&](uint32_t h) { return VRKDictionaryGetEntry(VRKDictionary{h}, token, &data); }},
      {5, false, [&](uint32_t h) { return VRKDictionaryGetEntry(live.dictionary, VRKToken{h}, &data); }},
      {4, false, [&](uint32_t h) { return VRKDictionarySetEntry(VRKDictionary{h}, token, live.data); }},
      {5, false, [&](uint32_t h) { return VRKDictionarySetEntry(live.dictionary, VRKToken{h}, live.data); }},
      {2, false, [&](uint32_t h) { return VRKDictionarySetEntry(live.dictionary, token, VRKData{h}); }},
      {4, false, [&](uint32_t h) { return VRKDictionaryCreateKeyList(VRKDictionary{h}, &list); }},
      {4, true, [&](uint32_t h) { return VRKDictionaryRetain(VRKDictionary{h}); }},
      {4, true, [&](uint32_t h) { return VRKDictionaryRelease(VRKDictionary{h}); }},
      {3, false, [&](uint32_t h) { return VRKListGetSize(VRKList{h}, &number); }},
      {3, false, [&](uint32_t h) { return VRKListGetEntry(VRKList{h}, 0, &data); }},
      {3, true, [&](uint32_t h) { return VRKListRetain(VRKList{h}); }},
      {3, true, [&](uint32_t h) { return VRKListRelease(VRKList{h}); }},
      {3, false, [&](uint32_t h) { return VRKHostListAppend(VRKList{h}, live.data); }},
      {2, false, [&](uint32_t h) { return VRKHostListAppend(live.list, VRKData{h}); }},
      {3, false, [&](uint32_t h) { return VRKHostListDataCreate(VRKList{h}, &data); }},
      {4, false, [&](uint32_t h) { return VRKHostDictionaryDataCreate(VRKDictionary{h}, &data); }},
      {6, false, [&](uint32_t h) { return VRKHostPlugInInitialize(VRKPlugIn{h}); }},
      {6, false, [&](uint32_t h) { return VRKHostPlugInTerminate(VRKPlugIn{h}); }},
      {6, false, [&](uint32_t h) { return VRKHostPlugInVersion(VRKPlugIn{h}, &number); }},
      {6, false, [&](uint32_t h) { return VRKHostPlugInUnload(VRKPlugIn{h}); }},
  };
  const Zoo dead;
  dead.Release();
  std::mt19937 random(6);
  const VRKHostLiveCounts before = Live();
  for (const auto& operation : operations) {
    SCOPED_TRACE(&operation - operations);
    std::vector<uint32_t> bad;
    if (operation.kind == 5) bad = {0xFFFFFFFF, 0x7FFFFFFF, 0x80000001, 100000};
    for (size_t kind = 0; kind < 5 && operation.kind != 5; ++kind) {
      bad.push_back(dead.Numbers()[kind]);
      if (kind != operation.kind) bad.push_back(live.Numbers()[kind]);
      for (int i = 0; i < 50; ++i) bad.push_back((uint32_t(random()) | 0x80000000) & 0xFFC0003F);  // slots in use, too
    }
    if (!operation.nullIsFine) bad.push_back(0);
    for (const uint32_t handle : bad) EXPECT_EQ(operation.call(handle), kVRKInvalidHandle) << handle;
    ASSERT_TRUE(Live() == before);
  }
  live.Release();
}

TEST_F(Kernel, CountsReferences) {
  const VRKData data = MakeData("type:test", "payload");
  VRKList list{};
  VRKDictionary dictionary{};
  VRKData listData{}, entry{}, again{};
  VRKToken type{};
  ASSERT_EQ(VRKHostListCreate(&list), 0u);
  ASSERT_EQ(VRKDictionaryCreate(0, &dictionary), 0u);
  ASSERT_EQ(VRKHostListAppend(list, data), 0u);
  ASSERT_EQ(VRKDictionarySetEntry(dictionary, Token("key"), data), 0u);
  ASSERT_EQ(VRKDictionarySetEntry(dictionary, Token("key"), data), 0u);
  ASSERT_EQ(VRKHostListDataCreate(list, &listData), 0u);
  VRKDataRelease(data);
  VRKListRelease(list);
  EXPECT_EQ(VRKListGetEntry(list, 0, &entry), 0u);
  EXPECT_EQ(VRKListGetEntry(list, 1, &entry), kVRKNotFound);
  EXPECT_EQ(VRKDictionaryGetEntry(dictionary, Token("key"), &again), 0u);
  EXPECT_EQ(VRKDictionaryGetEntry(dictionary, Token("other"), &again), kVRKNotFound);
  EXPECT_EQ(entry, again);
  EXPECT_EQ(BytesOf(entry), "payload");
  EXPECT_EQ(VRKDataGetData(listData, nullptr, nullptr, &type), 0u);
  EXPECT_EQ(type, Token("type:orvane.vrk.list"));

  VRKList keys{};
  uint32_t size = 0;
  ASSERT_EQ(VRKDictionaryCreateKeyList(dictionary, &keys), 0u);
  ASSERT_EQ(VRKListGetSize(keys, &size), 0u);
  EXPECT_EQ(size, 1u);
  ASSERT_EQ(VRKListGetEntry(keys, 0, &entry), 0u);
  const VRKToken key = Token("key");
  EXPECT_EQ(BytesOf(entry), std::string(reinterpret_cast<const char*>(&key), 4));
  VRKListRelease(keys);
  VRKDictionaryRelease(dictionary);
  VRKDataRelease(listData);
  EXPECT_NE(VRKListRetain(list), 0u);
  EXPECT_NE(VRKDataRetain(data), 0u);
}

TEST_F(Kernel, TellsStaleHandlesFromThoseThatCameAfter) {
  const VRKData stale = MakeData("type:test", "");
  VRKDataRelease(stale);
  for (int i = 0; i < 5000; ++i) {
    const VRKData later = MakeData("type:test", "");
    ASSERT_NE(later, stale);
    ASSERT_EQ(VRKDataRetain(stale), kVRKInvalidHandle) << i;
    VRKDataRelease(later);
  }
}

TEST_F(Kernel, ReleasesDeepNestsOnASmallStack) {
  VRKData inner = MakeData("type:test", "");
  for (int level = 0; level < 200000; ++level) {
    VRKList list{};
    VRKData outer{};
    ASSERT_EQ(VRKHostListCreate(&list) | VRKHostListAppend(list, inner) | VRKHostListDataCreate(list, &outer), 0u);
    VRKDataRelease(inner);
    VRKListRelease(list);
    inner = outer;
  }
  pthread_attr_t attributes;
  pthread_attr_init(&attributes);
  pthread_attr_setstacksize(&attributes, 1 << 18);
  pthread_t thread;
  const auto release = [](void* data) -> void* {
    VRKDataRelease(*static_cast<VRKData*>(data));
    return nullptr;
  };
  ASSERT_EQ(pthread_create(&thread, &attributes, release, &inner), 0);
  pthread_join(thread, nullptr);
  pthread_attr_destroy(&attributes);
}

TEST_F(Kernel, CoercesTextEveryWay) {
  struct {
    const char *from, *to;
    std::string bytes, coerced;
  } const cases[] = {
      {"utf8", "utf16le", "a\xE2\x82\xAC\xF0\x9F\x98\x80"s, "a\0\xAC\x20\x3D\xD8\x00\xDE"s},
      {"utf8", "utf16be", "a\xE2\x82\xAC"s, "\0a\x20\xAC"s},
      {"utf8", "utf16",
       "\xEF\xBB\xBF"s
       "a",
       "\xFF\xFE"
       "a\0"s},
      {"utf8", "utf16le", "\x80\xE2\x82z\0"s, "\xFD\xFF\xFD\xFFz\0\0\0"s},
      {"utf8", "utf16le", "", ""},
      {"utf8", "utf16", "", "\xFF\xFE"},
      {"utf16", "utf8",
       "\xFF\xFE"
       "a\0"s,
       "a"},
      {"utf16", "utf8", "\xFE\xFF\0a"s, "a"},
      {"utf16", "utf16le", "a\0"s, "a\0"s},
      {"utf16", "utf16be", "\xFF\xFE\xFF\xFE"s, "\xFE\xFF"s},
      {"utf16le", "utf8",
       "\x3D\xD8"
       "a\0\x00\xDE\x3D\xD8"s,
       "\xEF\xBF\xBD"
       "a\xEF\xBF\xBD\xEF\xBF\xBD"},
      {"utf16le", "utf16be", "\xFF\xFE\x3D\xD8"s, "\xFE\xFF\xFF\xFD"s},
      {"utf16be", "utf16", "\x20\xAC\x20"s, "\xFF\xFE\xAC\x20\xFD\xFF"s},
      {"utf16be", "utf8", "\0a\x20\xAC"s, "a\xE2\x82\xAC"s},
      {"utf16", "utf16", "\x3D\xD8x"s, "\x3D\xD8x"s},
  };
  for (const auto& each : cases) {
    SCOPED_TRACE(&each - cases);
    const VRKData source = MakeData(("type:orvane.vrk."s + each.from).c_str(), each.bytes);
    VRKData coerced{};
    ASSERT_EQ(VRKDataCoerce(source, Token(("type:orvane.vrk."s + each.to).c_str()), &coerced), 0u);
    EXPECT_EQ(BytesOf(coerced), each.coerced);
    VRKDataRelease(coerced);
    VRKDataRelease(source);
  }
  const VRKData text = MakeData("type:orvane.vrk.utf8", "1");
  VRKData coerced{};
  EXPECT_EQ(VRKDataCoerce(text, Token("type:orvane.vrk.double"), &coerced), kVRKCannotCoerce);
  VRKDataRelease(text);
}

TEST_F(Kernel, AsksCoercionHandlersLatestFirst) {
  std::string asked;
  VRKData result{};
  const VRKToken from = Token("type:test"), to = Token("type:orvane.vrk.utf8");
  const VRKData source = MakeData("type:test", "x");
  OnCoerce first = [&](VRKData, VRKData* out) {
    asked += "1";
    return VRKDataCreate(to, "one", 3, 0, out);
  };
  OnCoerce second = [&](VRKData data, VRKData*) {
    asked += "2";
    EXPECT_EQ(VRKDataCoercionHandlerRemove(RunCoerce, &second, 0, 0), 0u);
    EXPECT_EQ(VRKDataRelease(data), 0u);  // the last reference that the host had
    return VRKResult{kVRKCannotCoerce};
  };
  ASSERT_EQ(VRKDataCoercionHandlerInstall(from, to, 0, RunCoerce, &first), 0u);
  ASSERT_EQ(VRKDataCoercionHandlerInstall(from, Token("type:other"), 0, RunCoerce, &second), 0u);
  ASSERT_EQ(VRKDataCoercionHandlerInstall(from, to, 0, RunCoerce, &second), 0u);
  EXPECT_EQ(VRKDataCoercionHandlerInstall(from, to, 0, RunCoerce, &first), kVRKAlreadyExists);
  ASSERT_EQ(VRKDataCoerce(source, to, &result), 0u);
  EXPECT_EQ(asked, "21");
  EXPECT_EQ(BytesOf(result), "one");
  EXPECT_EQ(Live().dataCoercions, 1u);
  EXPECT_NE(VRKDataRelease(source), 0u);
  first = [](VRKData, VRKData*) { return VRKResult{0}; };
  const VRKData other = MakeData("type:test", "y");
  EXPECT_EQ(VRKDataCoerce(other, to, &result), kVRKNoResult);
  EXPECT_EQ(VRKDataCoercionHandlerRemove(RunCoerce, &first, 0, 0), 0u);
  EXPECT_EQ(VRKDataCoercionHandlerRemove(RunCoerce, &first, 0, 0), kVRKNotFound);
  VRKDataRelease(result);
  VRKDataRelease(other);
}

// What handlers may do while they are called.
TEST_F(Kernel, HoldsUpUnderReentrance) {
  std::string told;
  const VRKObject object = PlainObject();
  VRKMessageHandler removesItself{}, removedByOther{};
  OnMessage quiet = [&](VRKObject, VRKToken) { return told += "q", VRKResult{kVRKNotHandled}; };
  OnMessage remover = [&](VRKObject receiver, VRKToken) {
    told += "r";
    EXPECT_EQ(VRKMessageHandlerRemove(removesItself, receiver), 0u);
    EXPECT_EQ(VRKMessageHandlerRemove(removedByOther, receiver), 0u);
    Install(receiver, quiet, {"message:m"});  // not met by the delivery that runs
    EXPECT_EQ(Deliver(receiver, "message:other"), kVRKNotHandled);
    EXPECT_EQ(Deliver(receiver, "message:m"), kVRKNotHandled);
    VRKObjectRelease(PlainObject());
    return VRKResult{kVRKNotHandled};
  };
  Install(object, quiet, {"message:m"});
  removedByOther = Install(object, quiet, {"message:m"});
  removesItself = Install(object, remover, {"message:m"});
  EXPECT_EQ(Deliver(object, "message:m"), kVRKNotHandled);
  EXPECT_EQ(told, "rqqq");  // within: the new and the first one, then the first one
  EXPECT_EQ(Live().messageHandlers, 2u);

  OnMessage handles = [&](VRKObject, VRKToken) { return told += "h", VRKResult{0}; };
  OnMessage fails = [&](VRKObject, VRKToken) { return told += "f", VRKResult{4711}; };
  told.clear();
  const VRKMessageHandler registration = Install(object, handles, {"message:m"});
  EXPECT_EQ(Deliver(object, "message:m"), 0u);
  VRKMessageHandlerRemove(registration, object);
  Install(object, fails, {"message:m"});
  EXPECT_EQ(Deliver(object, "message:m"), 4711u);
  EXPECT_EQ(told, "hf");
  VRKObjectRelease(object);
}

TEST_F(Kernel, TellsHandlersOnceOfTheirObjectsDeath) {
  int deaths = 0;
  const VRKObject object = PlainObject();
  VRKMessageHandler registration{};
  OnMessage dies = [&](VRKObject receiver, VRKToken message) {
    if (message != Token(kDied)) return VRKObjectRelease(receiver);
    ++deaths;
    EXPECT_EQ(VRKObjectRetain(receiver), 0u);  // brings nothing back
    EXPECT_EQ(VRKObjectRelease(receiver), 0u);
    EXPECT_EQ(VRKObjectRetain(receiver), 0u);
    EXPECT_EQ(VRKMessageHandlerInstall(receiver, 0, RunMessage, nullptr, 0, 0, &registration), kVRKInvalidHandle);
    return VRKResult{0};
  };
  registration = Install(object, dies, {"message:m", kDied});
  Install(object, dies, {kDied});
  Install(object, dies, {"message:never"});
  EXPECT_EQ(Deliver(object, "message:m"), 0u);  // releases its own object
  EXPECT_EQ(deaths, 2);
  EXPECT_NE(VRKObjectRelease(object), 0u);
  EXPECT_NE(VRKMessageHandlerRemove(registration, object), 0u);

  const VRKObject fooled = PlainObject();  // a message of that name ends a registration too
  OnMessage counts = [&](VRKObject, VRKToken) { return ++deaths, VRKResult{0}; };
  Install(fooled, counts, {kDied});
  EXPECT_EQ(Deliver(fooled, kDied), 0u);
  VRKObjectRelease(fooled);
  EXPECT_EQ(deaths, 3);
}

TEST_F(Kernel, SurvivesCallbacksThatThrow) {
  if (!kLibrariesShareRuntime) GTEST_SKIP() << "the kernel cannot catch what the host throws";
  const auto throws = [](auto&&...) -> VRKResult { throw std::runtime_error("must not get out"); };
  const VRKToken from = Token("type:test"), to = Token("type:other");
  const VRKData data = MakeData("type:test", "x");
  VRKData coerced{};
  OnCoerce coerce = throws;
  ASSERT_EQ(VRKDataCoercionHandlerInstall(from, to, 0, RunCoerce, &coerce), 0u);
  EXPECT_EQ(VRKDataCoerce(data, to, &coerced), kVRKCallbackThrew);
  VRKDataRelease(data);
  VRKDataCoercionHandlerRemove(RunCoerce, &coerce, 0, 0);

  OnCreate create = throws;
  VRKObject object{};
  ASSERT_EQ(VRKObjectFactoryRegister(to, 0, RunCreate, &create), 0u);
  EXPECT_EQ(VRKObjectCreate(to, VRKDictionary{}, &object), kVRKCallbackThrew);
  VRKObjectFactoryUnregister(0, RunCreate, &create);

  int told = 0;
  OnMessage counts = [&](VRKObject, VRKToken) { return ++told, VRKResult{0}; };
  OnMessage thrower = throws;
  object = PlainObject();
  Install(object, counts, {kDied});
  Install(object, thrower, {"message:m", kDied});
  EXPECT_EQ(Deliver(object, "message:m"), kVRKCallbackThrew);
  EXPECT_EQ(VRKObjectRelease(object), 0u);
  EXPECT_EQ(told, 1);
}

// Released too often, telling themselves of their own death: none of it may hurt the kernel.
TEST_F(Kernel, SurvivesCallbacksThatMisbehave) {
  int told = 0;
  OnMessage releasesTwice = [&](VRKObject receiver, VRKToken message) {
    if (message == Token(kDied)) return ++told, VRKResult{0};
    return VRKObjectRelease(receiver) | VRKObjectRelease(receiver);
  };
  const VRKObject overReleased = PlainObject();
  Install(overReleased, releasesTwice, {"message:m", kDied});
  EXPECT_EQ(Deliver(overReleased, "message:m"), 0u);
  EXPECT_EQ(told, 1);

  const VRKToken from = Token("type:test"), to = Token("type:other");
  const VRKData source = MakeData("type:test", "x");
  VRKData coerced{};
  OnCoerce releases = [](VRKData data, VRKData*) { return VRKDataRelease(data), VRKDataRelease(data), VRKResult{kVRKCannotCoerce}; };
  ASSERT_EQ(VRKDataCoercionHandlerInstall(from, to, 0, RunCoerce, &releases), 0u);
  EXPECT_EQ(VRKDataCoerce(source, to, &coerced), kVRKInvalidHandle);
  VRKDataCoercionHandlerRemove(RunCoerce, &releases, 0, 0);

  OnMessage counts = [&](VRKObject, VRKToken) { return ++told, VRKResult{0}; };
  OnMessage tellsAgain = [&](VRKObject receiver, VRKToken) { return ++told, Deliver(receiver, kDied); };
  const VRKObject object = PlainObject();
  Install(object, counts, {kDied});
  Install(object, tellsAgain, {kDied});
  told = 0;
  EXPECT_EQ(VRKObjectRelease(object), 0u);
  EXPECT_EQ(told, 2);

  OnTrace shutsDown = [](const VRKHostTraceCall&) { return VRKHostShutDown(nullptr) == kVRKInUse ? VRKResult{0} : VRKResult{1}; };
  ASSERT_EQ(VRKHostSetTraceHook(RunTrace, &shutsDown), 0u);
  EXPECT_EQ(VRKObjectRetain(VRKObject{}), 0u);
  ASSERT_EQ(VRKHostSetTraceHook(nullptr, nullptr), 0u);
}

TEST_F(Kernel, MakesObjectsThroughFactories) {
  const VRKToken token = Token("class:test");
  VRKObject object{};
  EXPECT_EQ(VRKObjectCreate(token, VRKDictionary{}, &object), kVRKNotFound);
  OnCreate plain = [&](VRKDictionary parameters, VRKObject* out) {
    VRKList keys{};
    EXPECT_EQ(VRKDictionaryCreateKeyList(parameters, &keys), 0u);  // never null
    VRKListRelease(keys);
    return VRKObjectCreate(VRKToken{}, parameters, out);
  };
  OnCreate failing = [&](VRKDictionary, VRKObject* out) {
    VRKObject half{};
    VRKObjectCreate(VRKToken{}, VRKDictionary{}, &half);
    VRKObjectRelease(half);
    VRKObjectFactoryUnregister(0, RunCreate, &failing);
    *out = half;
    return VRKResult{4711};
  };
  ASSERT_EQ(VRKObjectFactoryRegister(token, 0, RunCreate, &plain), 0u);
  ASSERT_EQ(VRKObjectFactoryRegister(token, 0, RunCreate, &failing), 0u);
  EXPECT_EQ(VRKObjectFactoryRegister(token, 0, RunCreate, &plain), kVRKAlreadyExists);
  EXPECT_EQ(VRKObjectCreate(token, VRKDictionary{}, &object), 4711u);
  EXPECT_EQ(object, VRKObject{});
  EXPECT_EQ(VRKObjectCreate(token, VRKDictionary{}, &object), 0u);
  VRKObjectRelease(object);
  plain = [](VRKDictionary, VRKObject*) { return VRKResult{0}; };
  EXPECT_EQ(VRKObjectCreate(token, VRKDictionary{}, &object), kVRKNoResult);
  EXPECT_EQ(VRKObjectFactoryUnregister(0, RunCreate, &plain), 0u);
  EXPECT_EQ(VRKObjectFactoryUnregister(0, RunCreate, &plain), kVRKNotFound);
}

TEST_F(Kernel, TracesCallsAndMakesThemFail) {
  std::vector<std::string> calls;
  bool refuses = false;
  OnTrace hook = [&](const VRKHostTraceCall& call) {
    std::string line = std::string(2 * call.depth, ' ') + call.operation + (call.isFinished ? " =" + std::to_string(call.result) : "");
    if (call.isFinished && call.argumentCount > 0) {
      const VRKHostTraceArgument& last = call.arguments[call.argumentCount - 1];
      if (last.isOut && last.kind == kVRKTraceObject && last.number != 0) line += " object";
    }
    if (call.arguments[0].kind == kVRKTraceToken && call.arguments[0].number != 0)
      line += " "s + VRKTokenGetString(VRKToken{call.arguments[0].number});
    calls.push_back(line);
    VRKObjectRelease(PlainObject());  // not traced
    return refuses && !call.isFinished ? VRKResult{99} : VRKResult{0};
  };
  OnCreate plain = [](VRKDictionary parameters, VRKObject* out) { return VRKObjectCreate(VRKToken{}, parameters, out); };
  const VRKToken token = Token("class:test");
  ASSERT_EQ(VRKObjectFactoryRegister(token, 0, RunCreate, &plain), 0u);
  ASSERT_EQ(VRKHostSetTraceHook(RunTrace, &hook), 0u);
  VRKObject object{}, refused{};
  EXPECT_EQ(VRKObjectCreate(token, VRKDictionary{}, &object), 0u);
  const std::vector<std::string> expected = {"VRKObjectCreate class:test", "  VRKObjectCreate", "  VRKObjectCreate =0 object",
                                             "VRKObjectCreate =0 object class:test"};
  EXPECT_EQ(calls, expected);
  refuses = true;
  EXPECT_EQ(VRKObjectCreate(token, VRKDictionary{}, &refused), 99u);
  EXPECT_EQ(refused, VRKObject{});
  EXPECT_EQ(VRKRuntimeError(2, "d", "e", 0, "f", 1, "g", nullptr), 0u);
  ASSERT_EQ(VRKHostSetTraceHook(nullptr, nullptr), 0u);
  VRKObjectRelease(object);
  VRKObjectFactoryUnregister(0, RunCreate, &plain);
}

TEST_F(Kernel, IsThereForC) {
  EXPECT_EQ(CountCallsFromC(), 3u);
}

TEST_F(Kernel, ReportsFailedChecksOncePerSite) {
  uint32_t once = 0;
  const auto report = [&] { return VRKRuntimeError(2, "domain", "a == b", 0, "file", 12, "function", &once); };
  testing::internal::CaptureStderr();
  EXPECT_EQ(report() + report(), 0u);
  EXPECT_EQ(testing::internal::GetCapturedStderr(), "file:12: function: check failed: a == b [domain]\n");
  EXPECT_EQ(once, 1u);
  const auto reporter = [](uint32_t severity, const char*, const char* expression, const char*, uint32_t, const char*, uint32_t*,
                           void* context) -> uint32_t {
    *static_cast<std::string*>(context) = expression;
    return severity == 2;
  };
  std::string heard;
  ASSERT_EQ(VRKHostSetErrorReporter(reporter, &heard), 0u);
  EXPECT_EQ(report(), 1u);
  EXPECT_EQ(heard, "a == b");
}

void TellPlugIn(const std::string& whatToLeave) {
  std::string reason;
  const platform::SharedLibrary library = platform::LoadSharedLibrary(TEST_PLUG_IN, reason);
  reinterpret_cast<void (*)(const char*)>(platform::FindFunction(library, "TestLeave"))(whatToLeave.c_str());
  platform::UnloadSharedLibrary(library);
}

TEST_F(Kernel, LoadsPlugInsAndKeepsTheirObjects) {
  VRKPlugIn plugIn{};
  EXPECT_EQ(VRKHostPlugInLoad("/none/such", "Test", &plugIn), kVRKNotFound);
  EXPECT_NE(std::string(VRKHostLoadError()).find("/none/such"), std::string::npos);
  EXPECT_EQ(VRKHostPlugInLoad(TEST_PLUG_IN, "Other", &plugIn), kVRKNotFound);
  EXPECT_EQ(VRKHostLoadError(), "it has no entry point OtherInitialize"s);
  for (const auto& [leaves, unloads] :
       std::map<std::string, VRKResult>{{"", 0}, {"factory", kVRKInUse}, {"coercion", kVRKInUse}, {"handler", kVRKInUse}}) {
    SCOPED_TRACE(leaves);
    uint32_t version = 0;
    ASSERT_EQ(VRKHostPlugInLoad(TEST_PLUG_IN, "Test", &plugIn), 0u) << VRKHostLoadError();
    TellPlugIn(leaves);
    EXPECT_EQ(VRKHostPlugInVersion(plugIn, &version), 0u);
    EXPECT_EQ(version, 0x00020003u);
    EXPECT_EQ(VRKHostPlugInInitialize(plugIn), 0u);
    EXPECT_EQ(Live().objects, leaves == "handler" ? 2u : 1u);
    EXPECT_EQ(VRKHostPlugInTerminate(plugIn), 0u);
    EXPECT_EQ(Live().objects, leaves == "handler" ? 1u : 0u);
    EXPECT_EQ(VRKHostPlugInUnload(plugIn), unloads);
    if (unloads == 0) {
      EXPECT_NE(VRKHostPlugInUnload(plugIn), 0u);
    }
    VRKHostLiveCounts left{};
    EXPECT_EQ(VRKHostShutDown(&left), 0u);
    EXPECT_EQ(left.plugIns, unloads == 0 ? 0u : 1u);
    EXPECT_EQ(left.objectFactories + left.dataCoercions + left.messageHandlers, left.plugIns);
    ASSERT_EQ(VRKHostStart(), 0u);
  }
  ASSERT_EQ(VRKHostPlugInLoad(TEST_PLUG_IN, "Test", &plugIn), 0u);
  TellPlugIn("");
  VRKObject other{};
  ASSERT_EQ(VRKObjectCreate(VRKToken{}, VRKDictionary{}, &other), 0u);
  OnMessage restarts = [&](VRKObject, VRKToken) { return VRKHostPlugInInitialize(plugIn) + VRKHostPlugInTerminate(plugIn); };
  Install(other, restarts, {"message:m"});
  EXPECT_EQ(Deliver(other, "message:m"), 0u) << "other code than the plug-in's may run";
  VRKObjectRelease(other);
  VRKObject kept{};
  OnTrace notesObjects = [&](const VRKHostTraceCall& call) {
    if (call.isFinished && call.operation == "VRKObjectCreate"s) kept = VRKObject{call.arguments[2].number};
    return VRKResult{0};
  };
  ASSERT_EQ(VRKHostSetTraceHook(RunTrace, &notesObjects), 0u);
  EXPECT_EQ(VRKHostPlugInInitialize(plugIn), 0u);
  ASSERT_EQ(VRKHostSetTraceHook(nullptr, nullptr), 0u);
  std::vector<VRKResult> inner;
  OnMessage drives = [&](VRKObject, VRKToken) -> VRKResult {
    inner = {VRKHostPlugInInitialize(plugIn), VRKHostPlugInTerminate(plugIn), VRKHostPlugInUnload(plugIn)};
    return 0;
  };
  Install(kept, drives, {kDied});
  EXPECT_EQ(VRKHostPlugInUnload(plugIn), 0u);  // without terminate
  EXPECT_EQ(inner, std::vector<VRKResult>(3, kVRKInUse));
}

TEST_F(Kernel, ShutsDownAndStartsAgain) {
  const Zoo zoo;
  void* block = nullptr;
  ASSERT_EQ(VRKMemoryAllocate(8, 0, &block), 0u);
  EXPECT_EQ(VRKHostStart(), kVRKAlreadyExists);
  OnMessage shutsDown = [](VRKObject, VRKToken) { return VRKHostShutDown(nullptr); };
  Install(zoo.object, shutsDown, {"message:m"});
  EXPECT_EQ(Deliver(zoo.object, "message:m"), kVRKInUse);
  const VRKToken token = Token("type:test");
  const char* const text = VRKTokenGetString(token);
  VRKHostLiveCounts left{};
  EXPECT_EQ(VRKHostShutDown(&left), 0u);
  EXPECT_TRUE((left == VRKHostLiveCounts{1, 2, 0, 0, 1, 1, 1, 1, 0}));
  EXPECT_EQ(VRKDataRetain(zoo.data), kVRKNotRunning);
  EXPECT_EQ(VRKHostShutDown(&left), kVRKNotRunning);
  EXPECT_EQ(VRKMemoryDeallocate(block), 0u);
  ASSERT_EQ(VRKHostStart(), 0u);
  const Zoo next;
  EXPECT_EQ(VRKDataRetain(zoo.data), kVRKInvalidHandle);
  EXPECT_EQ(VRKObjectRetain(zoo.object), kVRKInvalidHandle);
  EXPECT_EQ(Token("type:test"), token);
  EXPECT_STREQ(text, "type:test");
  next.Release();
}

// Every allocation of a scenario fails once; whatever call was hit says so, and nothing is left
// over.
TEST_F(Kernel, SurvivesEveryFailedAllocation) {
  if (!kLibrariesShareRuntime) GTEST_SKIP() << "the kernel's allocations are its own";
  const VRKToken text = Token("type:orvane.vrk.utf8"), wide = Token("type:orvane.vrk.utf16"), message = Token("message:m");
  size_t failures = 0;
  for (bool failed = true; failed; failures += failed) {
    VRKObject object{};
    VRKMessageHandler registration{};
    VRKDictionary dictionary{};
    VRKData data{}, coerced{};
    VRKList keys{};
    VRKToken token{};
    VRKResult results[9] = {};
    const std::string fresh = "type:" + std::to_string(failures);
    {
      const AllocationMeter meter(failures + 1);
      results[0] = VRKObjectCreate(VRKToken{}, VRKDictionary{}, &object);
      results[1] = VRKMessageHandlerInstall(object, 0, RunMessage, nullptr, 0, 0, &registration);
      results[2] = VRKMessageHandlerAddMessages(registration, &message, 1);
      results[3] = VRKDataCreate(text, "some text", 9, 0, &data);
      results[4] = VRKDataCoerce(data, wide, &coerced);
      results[5] = VRKDictionaryCreate(0, &dictionary);
      results[6] = VRKDictionarySetEntry(dictionary, message, data);
      results[7] = VRKDictionaryCreateKeyList(dictionary, &keys);
      results[8] = VRKTokenCreate(fresh.c_str(), 0, &token);
      failed = meter.Failed();
    }
    EXPECT_EQ(std::count(std::begin(results), std::end(results), kVRKOutOfMemory), failed ? 1 : 0);
    VRKDataRelease(coerced);
    VRKDataRelease(data);
    VRKDictionaryRelease(dictionary);
    VRKListRelease(keys);
    VRKObjectRelease(object);
    ASSERT_TRUE(Live() == VRKHostLiveCounts{});
  }
  EXPECT_GT(failures, 12u);
}

}  // namespace
