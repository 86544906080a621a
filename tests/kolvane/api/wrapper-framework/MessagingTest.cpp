// Messages between a client and a handler, with a translator that notes what reaches it.

#include <boost/smart_ptr/make_shared.hpp>
#include <memory>

#include "kolvane/api/wrapper-framework/VRKStringTranslatorClient.h"
#include "kolvane/api/wrapper-framework/VRKStringTranslatorFactory.h"
#include "kolvane/api/wrapper-framework/VRKStringTranslatorHandler.h"
#include "kolvane/api/wrapper-framework/VRKStringTranslatorProtocol.h"
#include "tests/kolvane/source/Messages.h"
#include "tests/wrapper-framework/Support.h"
#include "wrapper-framework/source/Exceptions.h"
#include "wrapper-framework/source/ResultCodes.h"

namespace {

using namespace Varnel;
using Units = std::vector<uint16_t>;

struct NotingTranslator : StringTranslatorInterface {
  void MakeDefault() override { heard = "default"; }
  void SetTranslations(const char*, uint32_t) override { FAIL() << "bytes never reach a handler's translator"; }
  void SetTranslations(const uint16_t* units, uint32_t unitCount) override {
    heard = units == nullptr ? "set null" : "set";
    for (uint32_t i = 0; i < unitCount; ++i) heard += ' ' + std::to_string(units[i]);
  }
  void TranslateString(const char* key, uint32_t keyLength, Units& result) override {
    EXPECT_TRUE(result.empty());
    heard = "translate " + std::to_string(keyLength) + ' ' + std::string(key, keyLength);
    if (failure != 0) ThrowResultCode(failure);
    result = answer;
  }

  std::string heard;
  Units answer = {'x', 0};
  uint32_t failure = 0;
};

class MessagingTest : public KernelTest {
 protected:
  static ObjectRef NewObject(const DictionaryRef& parameters = {}) {
    ObjectRef object;
    object.Create(MakeToken(kClassStringTranslator), parameters.Get());
    return object;
  }

  boost::shared_ptr<NotingTranslator> translator = boost::make_shared<NotingTranslator>();
  size_t createdWith = 0;  // parameters
  uint32_t creationFailure = 0;
  StringTranslatorFactory factory{[this](orvane::dictionary_t const& parameters) {
                                    createdWith = parameters.elements().size();
                                    if (creationFailure != 0) ThrowResultCode(creationFailure);
                                    return translator;
                                  },
                                  orvane::name_t(kClassStringTranslator)};
};

TEST_F(MessagingTest, CarriesEachOperationToTheTranslatorAndTheAnswerBack) {
  const auto client = CreateStringTranslator();
  const uint16_t units[] = {0xFEFF, 'a'};
  const std::string key = "k";
  Units result(10, 7);
  const auto translate = [&](uint32_t length) { client->TranslateString(key.c_str(), length, result); };
  const struct {
    std::function<void()> operation;
    std::string heard;
  } cases[] = {{[&] { client->MakeDefault(); }, "default"},
               {[&] { client->SetTranslations(units, 2); }, "set 65279 97"},
               {[&] { client->SetTranslations(units + 1, 1); }, "set 97"},
               {[&] { client->SetTranslations(units, 0); }, "set null"},
               {[&] { client->SetTranslations("\xC3\xA9", 2); }, "set 65279 233"},
               {[&] { translate(1); }, {"translate 2 k\0", 14}},
               {[&] { translate(2); }, {"translate 2 k\0", 14}},
               {[&] { translate(0); }, "translate 0 "}};
  for (const auto& each : cases) {
    each.operation();
    EXPECT_EQ(translator->heard, each.heard);
  }
  EXPECT_EQ(result, translator->answer);
  for (const Units& answer : {Units{}, Units{'n', 'o', ' ', 'n', 'u', 'l'}, Units(1000, 0xD800)}) {
    translator->answer = answer;
    translate(1);
    EXPECT_EQ(result, answer);
  }
  translator->failure = 77;
  EXPECT_EQ(CodeOf([&] { translate(1); }), 77u);
  EXPECT_EQ(result, Units(1000, 0xD800));
}

TEST_F(MessagingTest, ClientsMissNothingButAnswers) {
  StringTranslatorClient client;
  Units result(3, 3);
  EXPECT_EQ(CodeOf([&] { client.MakeDefault(); }), VRKResult{kVRKInvalidHandle}) << "without an object";
  ObjectRef plain;
  plain.Create({}, {});
  client.SetObject(plain);
  client.MakeDefault();
  client.SetTranslations("x", 1);
  EXPECT_EQ(CodeOf([&] { client.TranslateString("k", 1, result); }), VRKResult{kVRKNotFound});
  EXPECT_EQ(result, Units(3, 3));
}

TEST_F(MessagingTest, LeavesAloneWhatItDoesNotServe) {
  const ObjectRef object = NewObject();
  const struct {
    const char *message, *parameter;
    VRKResult result;
    const char* heard;
  } cases[] = {{"message:test", kParameterTranslations, kVRKNotHandled, ""},
               {kMessageSetTranslations, "parameter:test", kVRKNotFound, ""},
               {kMessageTranslateString, kParameterTranslations, kVRKNotFound, ""},
               {kMessageMakeDefault, kParameterTranslations, 0, "default"}};
  for (const auto& each : cases) {
    const DictionaryRef parameters = With(each.parameter, DataOf(kTypeUTF16, "ab"));
    EXPECT_EQ(Send(object.Get(), each.message, parameters), each.result) << each.message;
    EXPECT_EQ(translator->heard, each.heard);
    EXPECT_EQ(parameters.CreateKeyList().GetSize(), 1u);
  }
}

// What cannot be coerced is coerced twice and reported, and only once when the kernel has heard
// enough.
TEST_F(MessagingTest, ReportsWhatItCannotCoerce) {
  const ObjectRef object = NewObject();
  const std::string start = "2|orvane.varnel.localizable-strings.user-glue.string-translator-handler|";
  const std::string file = "|kolvane/api/wrapper-framework/VRKStringTranslatorHandler|";
  const struct {
    const char *message, *parameter, *type;
    std::string report;
  } cases[] = {{kMessageSetTranslations, kParameterTranslations, kTypeUTF16,
                "translations.Coerce(gTypeUTF16, translations)" + file + "210|Varnel::StringTranslatorHandler::HandleSetTranslations"},
               {kMessageTranslateString, kParameterTranslationKey, kTypeUTF8,
                "translationKey.Coerce(gTypeUTF8, translationKey)" + file + "236|Varnel::StringTranslatorHandler::HandleTranslateString"}};
  for (const auto& each : cases) {
    Report report;
    VRKHostSetErrorReporter(&Report::Note, &report);
    int coercions = 0;
    Coercion coercion([&](auto&&...) { return ++coercions, false; });
    coercion.Install(MakeToken("type:test"), MakeToken(each.type));
    coercion.Install(MakeToken(kTypeLocaleIndependentUTF8), MakeToken(each.type));
    const auto send = [&](const char* type) { return Send(object.Get(), each.message, With(each.parameter, DataOf(type, "ab"))); };
    for (const int expected : {2, 2, 1, 1}) {
      coercions = 0;
      report.flagToSet = report.count;
      EXPECT_EQ(send("type:test"), kResultInputContractViolation);
      EXPECT_EQ(coercions, expected);
    }
    EXPECT_EQ(report.text, start + each.report);
    EXPECT_EQ(report.count, 2u);
    *report.flag = 0;
    EXPECT_EQ(send(kTypeLocaleIndependentUTF8), kResultInputContractViolation);
    EXPECT_EQ(report.count, each.type == kTypeUTF8 ? 2u : 3u) << "a key is expected to be what it is";
    *report.flag = 0;
  }
  EXPECT_EQ(translator->heard, "");
  const DictionaryRef parameters = With(kParameterTranslationKey, DataOf(kTypeUTF8, "k"));
  EXPECT_EQ(Send(object.Get(), kMessageTranslateString, parameters), 0u);
  EXPECT_EQ(GetType(parameters.GetEntry(MakeToken(kParameterMessageResult))), MakeToken(kTypeUTF16LE));
}

TEST_F(MessagingTest, HandlersOutliveObjectsThatTheyDoNotLiveWith) {
  CallTrace trace;
  StringTranslatorHandler handler(translator);
  for (int i = 0; i < 3; ++i) {
    ObjectRef object;
    object.Create({}, {});
    handler.SetObject(object.Get());
    translator->heard.clear();
    EXPECT_EQ(Send(object.Get(), kMessageMakeDefault), 0u);
    EXPECT_EQ(translator->heard, "default");
    const auto tokens = std::ranges::count(trace.Take(), "VRKTokenCreate 1");
    EXPECT_TRUE(i == 0 || tokens == 0) << "such deaths forget no tokens";
  }
}

TEST_F(MessagingTest, CreationIsUpToTheCreator) {
  const DictionaryRef parameters = With("parameter:test", DataOf(kTypeUTF8, "x"));
  NewObject(parameters);
  EXPECT_EQ(createdWith, 1u);
  EXPECT_EQ(translator.use_count(), 1) << "the object's, until it died";
  creationFailure = 77;
  EXPECT_EQ(CodeOf([] { NewObject(); }), 77u);
}

TEST_F(MessagingTest, FactoriesMayGoWhileParametersAreConverted) {
  const orvane::name_t name("class:test");
  auto other = std::make_unique<StringTranslatorFactory>([this](auto&) { return translator; }, name);
  Coercion coercion([&](auto&&...) { return other.reset(), false; });
  coercion.Install(MakeToken(kTypeUTF8), MakeToken(kTypeDouble));
  ObjectRef object;
  object.Create(MakeToken(name), With("parameter:test", DataOf(kTypeUTF8, "x")).Get());
  EXPECT_EQ(other, nullptr);
  EXPECT_EQ(Send(object.Get(), kMessageMakeDefault), 0u);
  EXPECT_EQ(translator->heard, "default");
}

// What a factory's creator or a handler's translator owns may use the kernel as it is destroyed.
TEST_F(MessagingTest, ServeNoOneWhileTheyAreDestroyed) {
  const orvane::name_t name("class:test");
  std::vector<VRKResult> results;
  const auto whenDestroyed = [&results](auto ask) {
    return boost::shared_ptr<void>(nullptr, [&results, ask](auto) { results.push_back(CodeOf(ask)); });
  };
  auto creator = [this, state = whenDestroyed([&] { ObjectRef().Create(MakeToken(name), {}); })](auto&) { return translator; };
  auto other = std::make_unique<StringTranslatorFactory>(std::move(creator), name);
  ObjectRef object;
  object.Create(MakeToken(name), {});
  other.reset();
  EXPECT_EQ(results, std::vector<VRKResult>{kVRKNotFound});

  results.clear();
  ObjectRef plain;
  plain.Create({}, {});
  struct AskingTranslator : NotingTranslator {
    explicit AskingTranslator(boost::shared_ptr<void> whenDestroyed) : state(std::move(whenDestroyed)) {}
    boost::shared_ptr<void> state;
  };
  const auto ask = [&] { ThrowIfFailed(Send(plain.Get(), kMessageMakeDefault)); };
  StringTranslatorHandler(boost::make_shared<AskingTranslator>(whenDestroyed(ask))).SetObject(plain.Get());
  EXPECT_EQ(results, std::vector<VRKResult>{kVRKNotHandled});
}

TEST(TranslationImage, HoldsEveryByte) {
  const Units expected[] = {{}, {0x0001}, {0x0201}, {0x0201, 0x00FF}, {0x0201, 0x04FF}, {0x0201, 0x04FF, 0x0005}};
  for (uint32_t count = 0; count < std::size(expected); ++count) {
    const std::string exact("\x01\x02\xFF\x04\x05", count);
    const auto image = PackTranslationImage(exact.data(), count);
    EXPECT_EQ(Units(image.units.get(), image.units.get() + image.unitCount), expected[count]);
    EXPECT_EQ(image.units == nullptr, count == 0);
  }
}

}  // namespace
