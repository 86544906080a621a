// The plug-in's translator, default translator and coercion, apart from its entry points.

#include "Data.h"
#include "Exceptions.h"
#include "ResultCodes.h"
#include "Support.h"
#include "VRKDefaultStringTranslator.h"
#include "VRKKolvaneCoercionImpl.h"
#include "VRKStringTranslatorImpl.h"
#include "VRKStringTranslatorProtocol.h"

namespace {

using namespace Varnel;
using namespace Varnel::LocalizableStrings;
using Units = std::vector<uint16_t>;
using Shared = boost::shared_ptr<StringTranslatorInterface>;

std::string Translated(StringTranslatorInterface& translator, const char* key) {
  Units units(10, 'x');
  translator.TranslateString(key, 0, units);
  EXPECT_EQ(units.back(), 0);
  return {units.begin(), units.end() - 1};
}

TEST(Translator, LoadsImagesAndTranslates) {
  const Shared translator = CreateStringTranslatorImpl({});
  const struct {
    const char* bytes;
    uint32_t byteCount;
    const char* translation;
  } images[] = {{nullptr, 0, "default"},
                {"\"$$$/k=too short\"", 16, "default"},
                {"\"$$$/k=up to its zero byte\"\n", 0, "up to its zero byte"},
                {"\"$$$/k=exactly these\"\n\"$$$/k=not these\"\n", 22, "exactly these"},
                {"\"$$$/other=leaves what there was\"\n", 34, "exactly these"}};
  for (const auto& each : images) {
    translator->SetTranslations(each.bytes, each.byteCount);
    EXPECT_EQ(Translated(*translator, "$$$/k=default"), each.translation);
  }
  EXPECT_EQ(CodeOf([&] { translator->SetTranslations("", 0x80000000u); }), kResultInvariantViolation);
  const uint16_t unit = 0;
  for (const uint32_t tooMany : {0x40000000u, 0x80000001u}) {
    EXPECT_EQ(CodeOf([&] { translator->SetTranslations(&unit, tooMany); }), kResultInvariantViolation);
  }
  const std::pair<const char*, const char*> keys[] = {
      {"", ""}, {nullptr, ""}, {"/k", "exactly these"}, {"$$x=y", ""}, {"$$$/none=a long enough text", "a long enough text"}};
  for (const auto& [key, translation] : keys) EXPECT_EQ(Translated(*translator, key), translation);
}

TEST(Translator, SurvivesEveryFailedAllocation) {
  SweepFaults(3, [](Fault& fault) {
    Units result(2, 5);
    VRKResult code = 0;
    {
      const AllocationMeter meter(fault);
      code = CodeOf([&] {
        const Shared translator = CreateStringTranslatorImpl({});
        translator->SetTranslations("\"$$$/k=a text of some length\"\n", 0);
        translator->TranslateString("$$$/k=default", 0, result);
      });
    }
    EXPECT_EQ(code, fault.hasFired ? kResultOutOfMemory : 0);
    EXPECT_EQ(result == Units(2, 5), fault.hasFired);
  });
}

TEST(DefaultTranslator, IsKnownToBeDead) {
  const auto dead = [](const auto& operation) { EXPECT_EQ(CodeOf(operation), kResultInvariantViolation); };
  const auto make = [](const char* image) {
    Shared translator = CreateStringTranslatorImpl({});
    translator->SetTranslations(image, 0);
    translator->MakeDefault();
    return translator;
  };
  dead([] { GetDefaultStringTranslator({}); });
  Shared a = make("\"$$$/k=a\"\n\"$$$/a=a alone\"\n");
  const Shared lentA = GetDefaultStringTranslator({});
  const Shared b = make("\"$$$/k=b\"\n\"$$$/b=b alone\"\n");
  EXPECT_EQ(Translated(*lentA, "$$$/k=none"), "a");
  EXPECT_EQ(Translated(*b, "$$$/a=not b's"), "not b's");
  lentA->MakeDefault();
  EXPECT_EQ(Translated(*b, "$$$/a=not b's"), "a alone");
  { const Shared shortLived = GetDefaultStringTranslator({}); }
  EXPECT_EQ(a.use_count(), 1);
  a.reset();
  const uint16_t unit = 0;
  Units result;
  dead([] { GetDefaultStringTranslator({}); });
  dead([&] { lentA->MakeDefault(); });
  dead([&] { lentA->SetTranslations("", 0); });
  dead([&] { lentA->SetTranslations(&unit, 1); });
  dead([&] { lentA->TranslateString("", 0, result); });
  b->MakeDefault();
  EXPECT_EQ(Translated(*GetDefaultStringTranslator({}), "$$$/k=none"), "b");
  dead([&] { lentA->TranslateString("", 0, result); });
  dead([&] { lentA->SetTranslations("", 0); });
}

class CoercionTest : public KernelTest {};

TEST_F(CoercionTest, TakesKeysAndWhatItCanOfOtherData) {
  Kolvanes::CoercionImpl coercion;
  const VRKToken key = MakeToken(kTypeLocaleIndependentUTF8), utf16le = MakeToken(kTypeUTF16LE);
  const DataRef untouched = MakeUTF8Data("x", 1);
  DataRef result = untouched;
  const auto coerce = [&](const char* type, const std::string& bytes, VRKToken from, VRKToken to) {
    const DataRef source = MakeData(type, bytes.data(), static_cast<uint32_t>(bytes.size()));
    return coercion.HandleCoercionImpl(source, from, to, result);
  };
  const auto text = [&] { return std::string(static_cast<const char*>(GetRawPayload(result).bytes), GetRawPayload(result).byteCount); };
  EXPECT_EQ(CodeOf([&] { coerce(kTypeLocaleIndependentUTF8, "k", utf16le, utf16le); }), kResultInputContractViolation);
  EXPECT_EQ(CodeOf([&] { coerce(kTypeLocaleIndependentUTF8, "k", key, utf16le); }), kResultInvariantViolation) << "no default";
  const Shared translator = CreateStringTranslatorImpl({});
  translator->MakeDefault();
  EXPECT_FALSE(coerce(kTypeLocaleIndependentUTF8, "k", key, MakeToken("type:none")));
  EXPECT_EQ(result.Get(), untouched.Get());
  using namespace std::string_literals;
  const struct {
    std::string key, translation;
  } keys[] = {{"", "\0\0"s}, {"$$$/k=OK", "O\0K\0\0\0"s}, {"$$$/k=OK\0"s, "O\0K\0\0\0"s}, {"$$$/k=\0OK"s, "\0\0"s}};
  for (const auto& each : keys) {
    EXPECT_TRUE(coerce(kTypeLocaleIndependentUTF8, each.key, key, utf16le));
    EXPECT_EQ(text(), each.translation);
  }

  Report report;
  VRKHostSetErrorReporter(&Report::Note, &report);
  EXPECT_TRUE(coerce(kTypeUTF16LE, "k\0=\0O\0K\0"s, key, utf16le)) << "becomes a key in UTF-8";
  EXPECT_EQ(text(), "O\0K\0\0\0"s);
  EXPECT_EQ(report.count, 0u);
  for (const uint32_t reports : {1u, 2u, 2u}) {
    report.flagToSet = report.count;
    EXPECT_TRUE(coerce("type:test", "$$$/k=as it lies", key, MakeToken(kTypeUTF8)));
    EXPECT_EQ(text(), "as it lies\0"s);
    EXPECT_EQ(report.count, reports);
  }
  EXPECT_EQ(report.text,
            "2|orvane.varnel.kolvanes|dataUTF8.Coerce(gTypeUTF8, dataUTF8)|kolvane/source/VRKKolvaneCoercionImpl|151|"
            "Varnel::Kolvanes::CoercionImpl::HandleCoercionImpl");
  EXPECT_TRUE(coerce(kTypeUTF16LE, "O\0K\0"s, key, utf16le));
  EXPECT_EQ(text(), "\0\0"s) << "no coercion any more: the bytes as they are end at the first zero";
  *report.flag = 0;
  Kolvanes::ResetTypeTokens();
}

}  // namespace
