// The plug-in's translators and its coercion, apart from its entry points.
#include "kolvane/api/wrapper-framework/VRKStringTranslatorProtocol.h"
#include "kolvane/source/VRKDefaultStringTranslator.h"
#include "kolvane/source/VRKKolvaneCoercionImpl.h"
#include "kolvane/source/VRKStringTranslatorImpl.h"
#include "tests/kolvane/source/Messages.h"
#include "tests/wrapper-framework/Support.h"
#include "wrapper-framework/source/Exceptions.h"
#include "wrapper-framework/source/ResultCodes.h"

namespace {

using namespace std::string_literals;
using namespace Varnel;
using namespace Varnel::LocalizableStrings;
using Shared = boost::shared_ptr<StringTranslatorInterface>;

TEST(Translator, LoadsBytes) {
  Shared translator = CreateStringTranslatorImpl({});
  translator->MakeDefault();
  const Shared lent = GetDefaultStringTranslator({});
  const struct {
    const char* bytes;
    uint32_t byteCount;
    std::string translation;
  } images[] = {{nullptr, 0, "default\0"s},
                {"\"$$$/k=too short\"", 16, "default\0"s},
                {"\"$$$/k=up to its zero byte\"\n", 0, "up to its zero byte\0"s},
                {"\"$$$/k=exactly these\"\n\"$$$/k=not these\"\n", 22, "exactly these\0"s},
                {"\"$$$/other=leaves what there was\"\n", 34, "exactly these\0"s}};
  for (const auto& each : images) {
    for (const Shared& by : {translator, lent}) {
      by->SetTranslations(each.bytes, each.byteCount);
      EXPECT_EQ(Translated(*by, "$$$/k=default"), each.translation);
    }
  }
  const uint16_t unit = 0;
  EXPECT_EQ(CodeOf([&] { translator->SetTranslations("", 0x80000000u); }), kResultInvariantViolation);
  for (const uint32_t tooMany : {0x40000000u, 0x80000001u}) {
    EXPECT_EQ(CodeOf([&] { translator->SetTranslations(&unit, tooMany); }), kResultInvariantViolation);
  }
  std::vector<uint16_t> units;
  translator->TranslateString(nullptr, 0, units);
  EXPECT_EQ(units, std::vector<uint16_t>{0});
  EXPECT_EQ(translator.use_count(), 1) << "lent, not shared";
  translator.reset();
  EXPECT_EQ(CodeOf([&] { lent->SetTranslations("", 0); }), kResultInvariantViolation);
}

using CoercionTest = KernelTest;

TEST_F(CoercionTest, ReportsWhatIsNoKeyAndTakesItAsItLies) {
  Kolvanes::CoercionImpl coercion;
  const VRKToken key = MakeToken(kTypeLocaleIndependentUTF8), utf16le = MakeToken(kTypeUTF16LE);
  const DataRef untouched = DataOf(kTypeUTF8, "x");
  DataRef result = untouched;
  const auto coerce = [&](const char* type, const std::string& bytes, VRKToken to) {
    return coercion.HandleCoercionImpl(DataOf(type, bytes), key, to, result);
  };
  EXPECT_EQ(CodeOf([&] { coercion.HandleCoercionImpl(untouched, utf16le, utf16le, result); }), kResultInputContractViolation);
  const Shared translator = CreateStringTranslatorImpl({});
  translator->MakeDefault();
  EXPECT_FALSE(coerce(kTypeLocaleIndependentUTF8, "k", MakeToken("type:none")));
  EXPECT_EQ(result.Get(), untouched.Get());

  Report report;
  VRKHostSetErrorReporter(&Report::Note, &report);
  EXPECT_TRUE(coerce(kTypeUTF16LE, "k\0=\0O\0K\0"s, utf16le)) << "becomes a key in UTF-8";
  EXPECT_EQ(RawText(result), "O\0K\0\0\0"s);
  EXPECT_EQ(report.count, 0u);
  for (const uint32_t reports : {1u, 2u, 2u}) {
    report.flagToSet = report.count;
    EXPECT_TRUE(coerce("type:test", "$$$/k=as it lies", MakeToken(kTypeUTF8)));
    EXPECT_EQ(RawText(result), "as it lies\0"s);
    EXPECT_EQ(report.count, reports);
  }
  EXPECT_EQ(report.text,
            "2|orvane.varnel.kolvanes|dataUTF8.Coerce(gTypeUTF8, dataUTF8)|kolvane/source/VRKKolvaneCoercionImpl|151|"
            "Varnel::Kolvanes::CoercionImpl::HandleCoercionImpl");
  EXPECT_TRUE(coerce(kTypeUTF16LE, "O\0K\0"s, utf16le));
  EXPECT_EQ(RawText(result), "\0\0"s) << "no coercion any more: the bytes as they are end at the first zero";
  *report.flag = 0;
  Kolvanes::ResetTypeTokens();
}

}  // namespace
