// What translations are told, as tables of texts.
#include <gtest/gtest.h>

#include <chrono>
#include <random>
#include <string>
#include <string_view>
#include <vector>

#include "Accelerators.h"
#include "Comparison.h"
#include "Rules.h"

namespace {

std::vector<uint16_t> Units(std::u16string_view text) {
  return {text.begin(), text.end()};
}

// A line for each difference: the rule, a colon and the message.
std::string Told(std::u16string_view reference, std::u16string_view translation) {
  std::string told;
  for (const Difference& each : Compare(Units(reference), Units(translation))) {
    if (!told.empty()) told += '\n';
    told += std::string(each.rule->name) + ": " + each.message;
  }
  return told;
}

struct Case {
  std::u16string_view reference;
  std::u16string_view translation;
  const char* told;
};

template <size_t kCount>
void Expect(const Case (&cases)[kCount]) {
  for (const Case& each : cases) {
    EXPECT_EQ(Told(each.reference, each.translation), each.told) << "case " << &each - cases;
  }
}

TEST(Comparison, ComparesPlaceholders) {
  Expect({
      // Present on both sides, in another order or form.
      {u"%s has %d", u"%s hat %i", ""},
      {u"%s has %d", u"%2$d hat %1$s", ""},
      {u"%1$s, %2$x", u"%s: %-#8X", ""},
      {u"%1$s, %2$d", u"%2$d: %1$s %1$s", ""},
      {u"%*.*f of %+e", u"%2$*1$d", "placeholder-missing: placeholders %*.*f, %+e are missing from the translation"},
      {u"%lld %zu %hhd", u"%I64d %Iu %-4hhi", ""},
      {u"%Lf %lf %hs %ws", u"%La %g %hs %ls", ""},
      {u"{0} of {1:N2}, {{2}}", u"{{x}}: {1}{0}{1,5}", ""},
      {u"{n, plural, one {# {x}} other {#}}", u"{n, plural, few {# {z}}}", ""},
      // One finding for all of a kind.
      {u"{0}", u"nichts", "placeholder-missing: placeholder {0} is missing from the translation"},
      {u"{1} %1$s {0} %2$s %2$s {1}", u"{0} %1$s", "placeholder-missing: placeholders {1}, %2$s are missing from the translation"},
      {u"{file_name.0-a}", u"{Datei:x} %d",
       "placeholder-missing: placeholder {file_name.0-a} is missing from the translation\nplaceholder-extra: placeholders {Datei}, %d are "
       "not in the reference"},
      {u"%*d", u"%s",
       "placeholder-missing: placeholder %*d is missing from the translation\nplaceholder-type: argument 1 is %s instead of %*d"},
      // Types.
      {u"%s: %d", u"%d: %s", "placeholder-type: argument 1 is %d instead of %s, argument 2 is %s instead of %d"},
      {u"%d", u"%lld", "placeholder-type: argument 1 is %lld instead of %d"},
      {u"%d %p", u"%u %n", "placeholder-type: argument 1 is %u instead of %d, argument 2 is %n instead of %p"},
      {u"%c %s %f", u"%lc %S %Lf",
       "placeholder-type: argument 1 is %lc instead of %c, argument 2 is %S instead of %s, argument 3 is %Lf instead of %f"},
      {u"%1$d", u"%1$d %1$s %1$s", "placeholder-type: argument 1 is %1$s instead of %1$d"},
      {u"%1$d (0x%1$x)", u"0x%1$x", ""},
      // Styles.
      {u"%s %s", u"%1$s %s", "placeholder-style: numbered %1$s and unnumbered %s stand in one text"},
      {u"%1$*2$d {0}", u"%1$*d",
       "placeholder-missing: placeholder {0} is missing from the translation\nplaceholder-style: numbered %1$*d and unnumbered %1$*d stand "
       "in one text"},
      {u"%1$s %s", u"%d", ""},
      // Text.
      {u"100% complete", u"100 % fertig", ""},
      {u"50% off", u"50%-os kedvezm\u00E9ny", ""},
      {u"50%% off, invalid %-encoding", u"50%-os", ""},
      {u"half", u"50%", ""},
      {u"half", u"%", ""},
      {u"half", u"%0$d %10000$d %99999999999999999999$d %5.k %", ""},
      {u"half", u"%%d {} { 0} {-} {.a} {a b} {a: b} {\u00E9} } {a, {", ""},
      {u"{{{0}}} {a, {b}", u"{{{0}}}", "placeholder-missing: placeholder {b} is missing from the translation"},
  });
}

TEST(Comparison, ComparesAccelerators) {
  Expect({
      {u"&File", u"&Datei", ""},
      {u"&File", u"\u30D5\u30A1\u30A4\u30EB(&F)", ""},
      {u"&File", u"Datei & && &\u00A0x &amp; &#38; '&' \u00AB&\u00BB (&) &\u0001 &",
       "accelerator-missing: the translation has no accelerator, the reference has accelerator &F"},
      {u"Search && replace", u"&Ersetzen", "accelerator-extra: the translation has accelerator &E, the reference has no accelerator"},
      {u"&File", u"&D&atei &\U00010400",
       "accelerator-extra: the translation has accelerators &D, &a, &\xF0\x90\x90\x80, the reference has accelerator &F"},
      {u"&? &{0}", u"? {0}", "accelerator-missing: the translation has no accelerator, the reference has accelerators &?, &{"},
      {u"/?a=1&b=2&c=3", u"/?a=1&b=4&c=5", ""},
      {u"&File", u"&\xD800", ""},
  });
}

TEST(Comparison, ComparesSpaceAndWords) {
  Expect({
      {u"a\r\nb\rc\u2028d\ne", u"a\nb\nc\n\rd", ""},
      {u"a\n", u"b", "line-breaks: the translation has 0 line breaks, the reference has 1"},
      {u"a\n\n", u"b\r\n", "line-breaks: the translation has 1 line break, the reference has 2"},
      {u"Name: ", u"Nom\u00A0:", "edge-space: white space at the end is missing from the translation"},
      {u"Name: ", u"Nom\u00A0:\u00A0", ""},
      {u"Name: ", u"\u540D\u524D\uFF1A", ""},
      {u"Name: ", u"\U00020000", ""},
      {u"Name:", u"\tName: ",
       "edge-space: white space at the start is not in the reference\nedge-space: white space at the end is not in the reference"},
      {u"Name: \n", u"Nom:\n", ""},
      {u"x", u"", "empty-translation: the translation is empty"},
      {u"", u" &x %d\n", ""},
      {u"OK", u"OK", "untranslated: the translation is the same as the reference"},
      {u"%d%% {name} 1.0 ", u"%d%% {name} 1.0 ", ""},
      {u"{name} \u0416", u"{name} \u0416", "untranslated: the translation is the same as the reference"},
      {u"\xD800\xDC00\xDC00", u"\xDC00\xD800", ""},
  });
}

TEST(Comparison, TellsAcceleratorLettersApart) {
  struct {
    std::u16string_view text;
    char32_t letter;  // or 0
  } const cases[] = {{u"Save &As", 'a'},
                     {u"\uC5F4\uAE30(&O)...", 'o'},
                     {u"&\u0424\u0430\u0439\u043B", 0x444},
                     {u"&\u00D6ffnen", 0xF6},
                     {u"&7", '7'},
                     {u"&A; B", 'a'},
                     {u"AT&&T", 0},
                     {u"&a&b", 0},
                     {u"&{0}", 0},
                     {u"&%d", 0}};
  for (const auto& each : cases) {
    EXPECT_EQ(AcceleratorOf(Units(each.text)).value_or(0), each.letter) << &each - cases;
  }
}

TEST(Comparison, FindsNothingInCopies) {
  constexpr std::u16string_view kAlphabet = u"%$*.1dsl{}0:, &;#a\n\xD800\xDC00";
  std::mt19937 random(1);
  for (int round = 0; round < 50'000; ++round) {
    std::u16string text;
    for (size_t length = random() % 16; length > 0; --length) {
      text += kAlphabet[random() % kAlphabet.size()];
    }
    for (const Difference& each : Compare(Units(text), Units(text))) {
      ASSERT_TRUE(each.rule == &rules::kUntranslated || each.rule == &rules::kPlaceholderStyle) << round << ": " << each.message;
    }
  }
}

// Far less than it takes to look through the rest of the text for each start of a placeholder.
TEST(Comparison, TakesLinearTime) {
  const auto start = std::chrono::steady_clock::now();
  for (const std::u16string_view part : {u"{a,", u"%*", u"%1$s", u"{", u"&a;", u"%9", u"{a"}) {
    std::u16string text;
    while (text.size() < 300'000) text += part;
    EXPECT_LE(Compare(Units(text), Units(u"x" + text)).size(), 1u);
  }
  EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(10));
}

}  // namespace
