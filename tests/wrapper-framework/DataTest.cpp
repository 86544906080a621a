// Typed data, and kernel data as values.
#include <pthread.h>

#include <algorithm>

#include "tests/platform/Breaks.h"
#include "tests/wrapper-framework/Support.h"
#include "wrapper-framework/source/Conversion.h"
#include "wrapper-framework/source/Data.h"
#include "wrapper-framework/source/Exceptions.h"
#include "wrapper-framework/source/Tokens.h"

namespace {

using orvane::array_t;
using orvane::dictionary_t;
using orvane::name_t;
using orvane::value_t;
using Varnel::AsArray;
using Varnel::AsDictionary;
using Varnel::AsValue;
using Varnel::DataRef;
using Varnel::DictionaryRef;
using Varnel::ListRef;
using Varnel::MakeData;
using Varnel::MakeToken;

template <class Holder, class Make, class... Arguments>
Holder Made(Make make, Arguments... arguments) {
  typename Holder::Handle handle{};
  EXPECT_EQ(make(arguments..., &handle), 0u);
  Holder holder;
  holder.Adopt(handle);
  return holder;
}

DataRef Wrapped(const ListRef& list) {
  return Made<DataRef>(VRKHostListDataCreate, list.Get());
}
DataRef Wrapped(const DictionaryRef& dictionary) {
  return Made<DataRef>(VRKHostDictionaryDataCreate, dictionary.Get());
}
DataRef Wrapped(VRKToken token) {
  return Made<DataRef>(VRKHostTokenDataCreate, token);
}
DataRef Number(double number) {
  return MakeData(Varnel::kTypeDouble, &number, sizeof number);
}
DataRef Text(const char* text) {
  return Varnel::MakeUTF8Data(text, static_cast<uint32_t>(std::strlen(text)));
}

ListRef List(const std::vector<DataRef>& entries) {
  const auto list = Made<ListRef>(VRKHostListCreate);
  for (const DataRef& entry : entries) EXPECT_EQ(VRKHostListAppend(list.Get(), entry.Get()), 0u);
  return list;
}

DictionaryRef Dictionary(const std::vector<std::pair<const char*, DataRef>>& entries) {
  DictionaryRef dictionary;
  dictionary.Create();
  for (const auto& [key, data] : entries) dictionary.SetEntry(MakeToken(key), data);
  return dictionary;
}

using DataTest = KernelTest;

TEST_F(DataTest, IsReadAsItWasMade) {
  const std::string text("a\0b", 3);
  EXPECT_EQ(Varnel::GetUTF8(Varnel::MakeUTF8Data(text.data(), 3)), text);
  EXPECT_EQ(Varnel::GetUTF8(Varnel::MakeUTF8Data(nullptr, 0)), "");
  const std::vector<uint16_t> units = {0xFEFF, 0, 0x20AC};  // a mark is text here
  std::vector<uint16_t> read(9);
  Varnel::GetUTF16LE(Varnel::MakeUTF16LEData(units.data(), 3), read);
  EXPECT_EQ(read, units);
  Varnel::GetUTF16(Varnel::MakeUTF16Data(units.data(), 2), read);
  EXPECT_EQ(read, std::vector<uint16_t>({0xFEFF, 0}));
  Varnel::GetUTF16LE(MakeData(Varnel::kTypeUTF16LE, "a\0b\0c", 5), read);
  EXPECT_EQ(read, std::vector<uint16_t>({'a', 'b'}));
  Varnel::GetUTF16(Varnel::MakeUTF16Data(nullptr, 0), read);
  EXPECT_TRUE(read.empty());
  EXPECT_THROW(Varnel::MakeUTF16Data(units.data(), 0x80000000), std::length_error);

  const ListRef list = List({});
  const DictionaryRef dictionary = Dictionary({});
  EXPECT_EQ(Varnel::GetDouble(Number(-1.5)), -1.5);
  EXPECT_TRUE(Varnel::GetBool(MakeData(Varnel::kTypeBool, "\x80", 1)));
  EXPECT_FALSE(Varnel::GetBool(MakeData(Varnel::kTypeBool, "\0", 1)));
  EXPECT_EQ(Varnel::GetToken(Wrapped(MakeToken("t"))), MakeToken("t"));
  EXPECT_EQ(Varnel::GetList(Wrapped(list)).Get(), list.Get());
  EXPECT_EQ(Varnel::GetDictionary(Wrapped(dictionary)).Get(), dictionary.Get());
}

// A kernel whose coercions keep none of the promises of their types.
TEST_F(DataTest, IsCheckedWhenItIsRead) {
  enum Outcome { kRead, kImpossible, kViolation, kOther };
  const auto outcome = [](auto read, const DataRef& source) {
    try {
      read(source);
      return kRead;
    } catch (const Varnel::InputContractViolation&) {
      return kViolation;
    } catch (const Varnel::Exception& error) {
      return error.GetResultCode() == 13 ? kImpossible : kOther;
    }
  };
  DataRef answer;
  Coercion coercion([&answer](const DataRef&, VRKToken, VRKToken, DataRef& result) {
    result = answer;
    return true;
  });
  const DataRef source = MakeData("type:test", "12345678", 8);
  const auto check = [&](const char* type, auto read, uint32_t byteCount, bool comparesType) {
    EXPECT_EQ(outcome(read, source), kImpossible) << type;
    coercion.Install(MakeToken("type:test"), MakeToken(type));
    for (const uint32_t count : {0u, 1u, 4u, 5u, 8u}) {
      answer = MakeData("type:other", "12345678", count);
      const bool fits = count == byteCount && !comparesType;
      EXPECT_EQ(outcome(read, source), fits ? kRead : kViolation) << type << ' ' << count;
    }
    EXPECT_EQ(outcome(read, DataRef()), kOther) << type;
  };
  check(Varnel::kTypeBool, Varnel::GetBool, 1, false);
  check(Varnel::kTypeDouble, Varnel::GetDouble, 8, true);
  check(Varnel::kTypeToken, Varnel::GetToken, 4, true);
  check(Varnel::kTypeList, Varnel::GetList, 4, true);
  check(Varnel::kTypeDictionary, Varnel::GetDictionary, 4, true);
  Coercion lists([](auto&&... arguments) { return std::get<3>(std::tie(arguments...)) = Wrapped(List({})), true; });
  lists.Install(MakeToken("type:test"), MakeToken(Varnel::kTypeList));
  EXPECT_EQ(Varnel::GetList(source).GetSize(), 0u) << "of which nobody else has a reference";
  for (const uint32_t count : {0u, 4u, 7u, 9u}) {
    EXPECT_EQ(outcome(Varnel::GetDouble, MakeData(Varnel::kTypeDouble, "123456789", count)), kViolation);
  }
}

TEST_F(DataTest, ReportsKeysOfAnotherSizeAndGoesOn) {
  Report report;
  report.answer = 0xFFFFFF00;  // only the low byte asks for a break
  VRKHostSetErrorReporter(&Report::Note, &report);
  const struct { uint32_t count, reports, value; } cases[] = {{4, 0, 0x04030201}, {5, 1, 0x04030201}, {3, 1, 0x00030201}, {0, 1, 0}};
  const auto extract = [](uint32_t count) { return Varnel::ExtractData<uint32_t>(MakeData("type:test", "\1\2\3\4\5", count)); };
  for (const auto& each : cases) {
    report.count = 0;
    EXPECT_EQ(extract(each.count), each.value);
    EXPECT_EQ(report.count, each.reports) << each.count;
  }
  EXPECT_EQ(report.text,
            "2|varnel.wrapper-framework|sizeof(T) == dataSize|wrapper-framework/source/Data.h|51|"
            "`anonymous-namespace'::ExtractData");
  EXPECT_EQ(CodeOf([] { Varnel::ExtractData<uint32_t>(DataRef()); }), VRKResult{kVRKInvalidHandle});
  report.answer = 1;
  EXPECT_EQ(BreaksOf([&] { extract(3); }), 1);
}

TEST_F(DataTest, BecomesValues) {
  const DataRef null = MakeData(Varnel::kTypeNull, nullptr, 0);
  const DictionaryRef inner = Dictionary({{"b", Number(2)}, {"a", Text("true")}, {"c", null}});
  const ListRef list = List({Wrapped(List({})), Wrapped(inner), Wrapped(MakeToken("name")), MakeData(Varnel::kTypeBool, "\1", 1)});
  dictionary_t expectedInner;
  expectedInner.insert_or_assign(name_t("a"), value_t(std::string("true")));
  expectedInner.insert_or_assign(name_t("b"), value_t(2.0));
  expectedInner.insert_or_assign(name_t("c"), value_t());
  array_t expected;
  expected.push_back(value_t(array_t()));
  expected.push_back(value_t(expectedInner));
  expected.push_back(value_t(name_t("name")));
  expected.push_back(value_t(true));
  EXPECT_EQ(AsValue(Wrapped(list)), value_t(expected));
  EXPECT_EQ(AsArray(list), expected);
  EXPECT_EQ(AsDictionary(inner), expectedInner);
  EXPECT_EQ(AsValue(Wrapped(inner)), value_t(expectedInner));
  EXPECT_TRUE(AsArray(List({})).shares_with(array_t()));
  EXPECT_TRUE(AsDictionary(DictionaryRef()).shares_with(dictionary_t()));
  EXPECT_EQ(AsArray(list).use_count(), 1u);
}

TEST_F(DataTest, BecomesTheFirstTypeThatTheKernelKnowsAWayTo) {
  const DataRef source = MakeData("type:test", "x", 1);
  std::vector<std::string> expected;
  for (const char* type : {"double", "bool", "utf8", "null", "token", "list", "dictionary"}) {
    expected.push_back(Call("VRKDataCoerce", source.Get(), MakeToken((std::string("type:orvane.vrk.") + type).c_str())));
  }
  CallTrace trace;
  EXPECT_THROW(AsValue(source), std::domain_error);
  std::vector<std::string> calls = trace.Take();
  std::erase_if(calls, [](const std::string& call) { return !call.starts_with("VRKDataCoerce"); });
  EXPECT_EQ(calls, expected);
}

TEST_F(DataTest, IsHeldUntilAllOfItIsConverted) {
  for (const DataRef& source : {Wrapped(List({Text("x")})), Wrapped(Dictionary({{"key", Text("x")}}))}) {
    CallTrace trace;
    AsValue(source);
    EXPECT_EQ(trace.Take().back(), Call("VRKDataRelease", source.Get()));
  }
}

// What hosts have for their threads by default, or less.
void RunOnSmallStack(std::function<void()> body) {
  pthread_attr_t attributes;
  ASSERT_EQ(pthread_attr_init(&attributes), 0);
  ASSERT_EQ(pthread_attr_setstacksize(&attributes, 1 << 20), 0);
  const auto run = [](void* function) -> void* {
    (*static_cast<std::function<void()>*>(function))();
    return nullptr;
  };
  pthread_t thread;
  ASSERT_EQ(pthread_create(&thread, &attributes, run, &body), 0);
  ASSERT_EQ(pthread_join(thread, nullptr), 0);
  pthread_attr_destroy(&attributes);
}

TEST_F(DataTest, MayBeNestedDeeply) {
  RunOnSmallStack([] {
    DataRef deepest = Number(1);
    for (size_t i = 0; i < Varnel::kNestingLimit; ++i) {
      deepest = i % 2 == 0 ? Wrapped(List({deepest})) : Wrapped(Dictionary({{"key", deepest}}));
    }
    value_t value = AsValue(deepest);
    const value_t same = AsValue(deepest);
    EXPECT_TRUE(value == same);
    value = value_t(value);
    value = value_t();
    EXPECT_THROW(AsValue(Wrapped(List({deepest}))), std::length_error);
  });
}

TEST_F(DataTest, MayBeSharedOnlyByAMillionValues) {
  DataRef shared = Text("x");
  for (int i = 0; i < 60; ++i) shared = i % 2 == 0 ? Wrapped(List({shared, shared})) : Wrapped(Dictionary({{"a", shared}, {"b", shared}}));
  EXPECT_THROW(AsValue(shared), std::length_error);
}

// Such a list never dies, so its kernel ends with it.
TEST(DataThatContainsItself, IsNestedTooDeeply) {
  ASSERT_EQ(VRKHostStart(), 0u);
  {
    const ListRef list = List({Number(1)});
    const DataRef self = Wrapped(list);
    for (int i = 0; i < 2; ++i) ASSERT_EQ(VRKHostListAppend(list.Get(), self.Get()), 0u);
    const std::string before = Alive();
    RunOnSmallStack([&] { EXPECT_EQ(CodeOf([&] { AsValue(self); }), 20u); });
    EXPECT_EQ(Alive(), before);
  }
  EXPECT_EQ(VRKHostShutDown(nullptr), 0u);
}

}  // namespace
