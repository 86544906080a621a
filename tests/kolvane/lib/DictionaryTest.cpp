// Keys through: what a dictionary answers.
#include <gtest/gtest.h>

#include <boost/interprocess/streams/bufferstream.hpp>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "KolvaneDictionary.h"
#include "OVErrException.h"
#include "SlowTwin.h"
#include "Support.h"

namespace {

std::string ReadFile(const std::filesystem::path& path) {
  std::ifstream file(path, std::ios::binary);
  std::ostringstream bytes;
  bytes << file.rdbuf();
  return bytes.str();
}

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
  KolvaneDictionary asking;
  const auto answer = [&] {
    const int utf8 = 1;
    const TranslatedString translated = asking.Translate("$$$/a=none", &utf8);
    std::vector<uint16_t> units(translated.BufferSize());
    translated.CopyTo(units.data(), translated.BufferSize(), true);
    return std::u16string(units.begin(), units.end() - 1);
  };
  const auto made = [](const std::string& value) {
    auto dictionary = std::make_unique<KolvaneDictionary>();
    const std::string image = "\"$$$/a=" + value + "\"\n\n\n\n\n\n\n\n\n\n\n\n";
    boost::interprocess::ibufferstream stream(image.data(), image.size());
    dictionary->Load(stream);
    EXPECT_TRUE(dictionary->LastLoad().Complete());
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

// A text dictionary's answers, and those of the same dictionary as a binary.
void ExpectSameAnswersAsBinary(const std::filesystem::path& path) {
  SCOPED_TRACE(path);
  const std::string image = ReadFile(path);
  DictionaryTable text;
  SlowTwin twin;
  Load(text, image);
  twin.Load(image);
  ASSERT_TRUE(text.LastLoad().Complete());
  ASSERT_GT(text.LastLoad().entriesAdded, 50u);
  const Contents contents = ContentsOf(text);
  ASSERT_EQ(contents, twin.AllContents());
  std::vector<ImageGroup> groups;
  for (const auto& [bucket, key, value] : contents) {
    if (groups.empty() || groups.back().bucket != bucket) groups.push_back({static_cast<uint16_t>(bucket), {}});
    groups.back().entries.emplace_back(key, Bytes(value));
  }
  for (const std::string& binary : {Image1_5(0, groups), Image1_0(0, groups)}) {
    DictionaryTable table;
    Load(table, binary);
    ASSERT_TRUE(table.LastLoad().Complete());
    ASSERT_EQ(ContentsOf(table), contents);
    for (const auto& [bucket, key, value] : contents) ASSERT_EQ(Translated(table, key.c_str()), value);
  }
}

TEST(Dictionary, AnswersForRealTranslationsInEveryFormat) {
  size_t count = 0;
  for (const auto& file : std::filesystem::directory_iterator(ISO_CODES_FOLDER)) {
    ExpectSameAnswersAsBinary(file);
    ++count;
  }
  EXPECT_GT(count, 3u);
}

TEST(Dictionary, SamplesSayWhatTheirTwinsSay) {
  const std::filesystem::path samples = SAMPLES_FOLDER;
  for (const char* const name : {"de.txt", "fr.txt", "ja.txt", "es.txt", "it.txt"}) {
    ExpectSameAnswersAsBinary(samples / name);
  }
  DictionaryTable text, binary;
  Load(text, ReadFile(samples / "it.txt"));
  Load(binary, ReadFile(samples / "it.bin"));
  EXPECT_TRUE(binary.LastLoad().Complete());
  for (const auto& [bucket, key, value] : ContentsOf(text)) EXPECT_EQ(Translated(binary, key.c_str()), value);
  EXPECT_EQ(binary.LastLoad().entriesAdded, text.LastLoad().entriesAdded);
}

}  // namespace
