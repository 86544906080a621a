// The grammar as tables of cases.
#include <gtest/gtest.h>

#include "kolvane/lib/NamedCharacters.h"
#include "kolvane/lib/TextSyntax.h"
#include "tests/kolvane/lib/Support.h"

namespace {

using namespace tovali_private;

std::u16string Unescaped(const std::u16string& text) {
  return Text(Unescape(Units(text)));
}

TEST(TextSyntax, StoresLines) {
  struct {
    const char16_t* line;
    StoredLine stored;
    const char* key;
    const char16_t* value;
  } const cases[] = {
      {u"\"$$$/a=b\"", StoredLine::kAdded, "/a", u"b"},
      {u"$$$/a=b", StoredLine::kAdded, "/a", u"b"},
      {u"\"/a=b\"", StoredLine::kAdded, "/a", u"b"},
      {u"\"$$$/a=b=c\"", StoredLine::kAdded, "/a", u"b=c"},
      {u"  \"$$$/a=b\"  trailing words", StoredLine::kAdded, "/a", u"b"},
      {u"\"$$$/a\"", StoredLine::kAdded, "/a", u""},
      {u"\"\"", StoredLine::kAdded, "", u""},
      {u"; note", StoredLine::kAdded, "; note", u""},
      {u"\"$$$/a=b", StoredLine::kAdded, "/a", u"b"},
      {u"\"$$$/a=say \\\"hi\\\"\"", StoredLine::kAdded, "/a", u"say \"hi\""},
      {u"\"$$$/a=C:\\\\\"", StoredLine::kAdded, "/a", u"C:\\\""},
      {u"\\\"$$$/a=b", StoredLine::kAdded, "\\\"$$$/a", u"b"},
      {u"\\\\\"x=\"/a=b\"", StoredLine::kAdded, "/a", u"b"},
      {u"\"\u00E9\u20AC=x\"", StoredLine::kAdded, "\xE9\xAC", u"x"},
      {u"\uFEFF/a=b", StoredLine::kAdded, "\xFF/a", u"b"},
      {u"\"$$/a=b\"", StoredLine::kDropped, "", nullptr},
      {u"\"$a=b\"", StoredLine::kDropped, "", nullptr},
      {u"$$", StoredLine::kDropped, "", nullptr},
  };
  for (const auto& each : cases) {
    SCOPED_TRACE(&each - cases);
    DictionaryTable table;
    EXPECT_EQ(table.StoreLine(Units(each.line)), each.stored);
    Contents expected;
    if (each.value != nullptr) expected.emplace_back(BucketOf(each.key), each.key, each.value);
    EXPECT_EQ(ContentsOf(table), expected);
  }
}

TEST(TextSyntax, DecodesEscapesAndNames) {
  struct {
    const char16_t* text;
    const char16_t* decoded;
  } const cases[] = {
      {u"^Q^[^]^{^}^C^R^T^D^B^#^!^I^S^n^r", u"\"\u201C\u201D\u2018\u2019\u00A9\u00AE\u2122\u00B0\u2022\u2318\u00AC\u2206\u2211\n\r"},
      {u"\\\"\\n\\r\\t\\b", u"\"\n\r\t\b"},
      {u"^^ and \\\\ ok", u"^ and \\ ok"},
      {u"100^", u"100^"},
      {u"^x\\z^t\\Q^N", u"^x\\z^t\\Q^N"},
      {u"^\\n\\^n", u"^\\n\\^n"},
      {u"5 #{euro}#{nbsp}#{tab}|", u"5 \u20AC\u00A0\t|"},
      {u"#{Agrave}#{agrave}#{frac34}#{yuml}", u"\u00C0\u00E0\u00BE\u00FF"},
      {u"#{Euro}#{AMP}#{}#{amp", u"#{Euro}#{AMP}#{}#{amp"},
      {u"#{#{amp}}#{am#{lt}", u"#{&}#{am<"},
      {u"^#{amp}", u"\u2318{amp}"},
      {u"#{thetasym}#{thinspx}", u"#{thetasym}#{thinspx}"},
  };
  for (const auto& each : cases) EXPECT_EQ(Unescaped(each.text), each.decoded) << &each - cases;
}

TEST(TextSyntax, KnowsEveryName) {
  const auto names = NamedCharacters();
  ASSERT_EQ(names.size(), 132u);
  for (size_t i = 0; i < 96; ++i) EXPECT_EQ(names[4 + i].character[0], 0xA0 + i);
  constexpr char16_t kSpecial[] =
      u"\"&<>\u0152\u0153\u0160\u0161\u0178\u02C6\u02DC\u2002\u2003\u2009\u200C\u200D\u200E\u200F"
      u"\u2013\u2014\u2018\u2019\u201A\u201C\u201D\u201E\u2020\u2021\u2030\u2039\u203A\u20AC";
  for (size_t i = 0; i < 32; ++i) EXPECT_EQ(names[100 + i].character[0], kSpecial[i]);
  for (const NamedCharacter& named : names) {
    const std::u16string written = u"#{" + std::u16string(named.name.begin(), named.name.end()) + u"}";
    EXPECT_EQ(Units(Unescaped(written)), std::vector(named.Units().begin(), named.Units().end()));
  }
}

TEST(TextSyntax, EscapesWhatEndsALineOrAText) {
  EXPECT_FALSE(EscapeForText(Units(u"plain ^ \\ #{amp}")).has_value());
  EXPECT_EQ(EscapeForText(Units(u"a\nb\rc\"d\\")), Units(u"a\\nb\\rc\\\"d\\"));
}

}  // namespace
