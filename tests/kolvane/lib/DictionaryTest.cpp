// Keys through: what a dictionary answers.
#include <gtest/gtest.h>

#include <fstream>

#include "kolvane/lib/OVErrException.h"
#include "tests/kolvane/lib/Support.h"

namespace {

TEST(Dictionary, Translates) {
  DictionaryTable table, other;
  Load(table, "\"$$$/a=Hello\"\n\"$$$/both=own\"\n\"$$$/empty=\"\n\"$$$=no key\"\n");
  Load(table, Image1_5(0, Grouped({{"/raw", Bytes(u"^n")}})));
  Load(other, "\"$$$/both=default\"\n\"$$$/other=from default\"\n");
  other.MakeDefault();
  struct {
    const char* text;
    const char16_t* translation;
  } const cases[] = {
      {nullptr, u""},
      {"", u""},
      {"$$", u""},
      {"$x=abc", u""},
      {"$$$", u"no key"},
      {"$$$=x", u"no key"},
      {"$$$/a=Fallback", u"Hello"},
      {"/a=Fallback", u"Hello"},
      {"$$$/a", u"Hello"},
      {"$$$/A=Fallback", u"Fallback"},
      {"$$$/missing", u""},
      {"$$$/k=Tab^nLine=x", u"Tab\nLine=x"},
      {"$$$/both=x", u"own"},
      {"$$$/other=x", u"from default"},
      {"$$$/empty=x", u""},
      {"$$$/raw=x", u"^n"},
      {"$$$/k=\xE2\x82\xAC #{euro}", u"\u20AC \u20AC"},
  };
  for (const auto& each : cases) EXPECT_EQ(Translated(table, each.text), each.translation) << &each - cases;
  EXPECT_EQ(Translated(other, "$$$/a=x"), u"x");
  EXPECT_EQ(Translated(other, "$$$/other=x"), u"from default");
  EXPECT_EQ(Translated(table, "$$$/k=\x80^n", 0), u"\u0080\n");
  EXPECT_EQ(Translated(table, "$$$/k=\x80", 2), u"\u20AC");
  EXPECT_EQ(Text(KolvaneString()), Translated(table, "$$$/empty=x"));
}

TEST(Dictionary, DefaultMovesAndDies) {
  DictionaryTable asking;
  const auto answer = [&] { return Translated(asking, "$$$/a=none"); };
  const auto made = [](const std::string& value) {
    auto dictionary = std::make_unique<DictionaryTable>();
    Load(*dictionary, "\"$$$/a=" + value + "\"\n\n\n\n\n\n\n\n\n\n\n\n");
    dictionary->MakeDefault();
    return dictionary;
  };
  EXPECT_EQ(answer(), u"none");
  auto first = made("first");
  EXPECT_EQ(answer(), u"first");
  auto second = made("second");
  EXPECT_EQ(answer(), u"second");
  first.reset();
  EXPECT_EQ(answer(), u"second");
  second.reset();
  EXPECT_EQ(answer(), u"none");
}

TEST(TranslatedString, CopiesWhatFits) {
  const TranslatedString text{KolvaneString(Units(u"abc").data(), 3)};
  EXPECT_EQ(text.BufferSize(), 4u);
  for (uint32_t capacity = 0; capacity <= 5; ++capacity) {
    std::vector<uint16_t> buffer(5, 'x');
    const auto copy = [&](bool throwIfShort) { text.CopyTo(buffer.data(), capacity, throwIfShort); };
    EXPECT_NO_THROW(copy(false));
    try {
      copy(true);
      EXPECT_GE(capacity, 4u);
    } catch (const OVErrException& error) {
      EXPECT_LT(capacity, 4u);
      EXPECT_EQ(error.Code(), kErrorBufferTooSmall);
    }
    std::u16string expected = capacity == 0 ? u"" : std::u16string(u"abc").substr(0, capacity - 1) + u'\0';
    expected.resize(5, u'x');
    EXPECT_EQ(buffer, Units(expected)) << capacity;
  }
}

TEST(Dictionary, SamplesInBothFormatsAnswerTheSame) {
  const auto answers = [](const char* name) {
    std::ifstream image(std::string(SAMPLES_FOLDER) + "/" + name, std::ios::binary);
    DictionaryTable table;
    table.Load(image);
    EXPECT_TRUE(table.LastLoad().Complete());
    EXPECT_GT(table.LastLoad().entriesAdded, 50u);
    return AnswersOf(table);
  };
  EXPECT_EQ(answers("it.bin"), answers("it.txt"));
}

}  // namespace
