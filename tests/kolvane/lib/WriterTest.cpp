// Dictionaries out, as images and as lines of text, and in again.
#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <sstream>

#include "DictionaryWriter.h"
#include "Support.h"
#include "TextSyntax.h"

using namespace tovali_private;

namespace {

std::string Written(DictionaryTable& table, BinaryVersion version, TextEncoding values, size_t lost = 0) {
  std::ostringstream image;
  EXPECT_EQ(WriteBinary(table, version, values, image).size(), lost);
  return image.str();
}

// The table's entries as lines of text; those that no line can hold are left out of both.
std::string AsText(DictionaryTable& table, Answers& written) {
  std::vector<uint16_t> text = {0xFEFF};
  for (const DictionaryEntry* entry : FoundEntries(table)) {
    const size_t before = text.size();
    if (AppendLine(entry->Bytes(), entry->Value().Units(), text) != LineObstacle::kNone) {
      EXPECT_EQ(text.size(), before);
      continue;
    }
    text.push_back('\n');
    written[{entry->Bytes().begin(), entry->Bytes().end()}] = Text(entry->Value());
  }
  if (text.size() == 1) return std::string(21, '\n');  // a mark on a line of its own would be a key
  text.insert(text.end(), 21, '\n');
  return {reinterpret_cast<const char*>(text.data()), text.size() * 2};
}

// Keys and values of what is awkward, put together at random: a few of one bucket, some twice.
std::vector<std::pair<std::string, std::string>> RandomEntries(std::mt19937& random) {
  static const std::u16string kParts[] = {u"a",      u"\\",     u"\"",     u"^",      u"#",      u"#{",     u"}", u"amp", u"#{amp}",
                                          u"=",      u"$",      u"\n",     u"\r",     u"\t",     u"\b",     u" ", u"Q",   u"n",
                                          u"\u2028", u"\uFEFF", u"\u00A0", u"\u200B", u"\xD83D", u"\xDE00", u"😀", u"é",   {u'\0'}};
  const auto text = [&](size_t most) {
    std::u16string made;
    for (size_t count = random() % (most + 1); count > 0; --count) made += kParts[random() % std::size(kParts)];
    return made;
  };
  std::vector<std::pair<std::string, std::string>> entries;
  for (size_t count = random() % 30; count > 0; --count) {
    const std::u16string key = text(3);
    entries.emplace_back(
        random() % 4 == 0 ? "/same/bucket/12" + std::string(1, static_cast<char>('0' + random() % 5)) : std::string(key.begin(), key.end()),
        Bytes(text(6)));
  }
  return entries;
}

}  // namespace

TEST(WriterTest, LaysImagesOut) {
  for (const auto& entries : {std::vector<std::pair<std::string, std::string>>{{"/a", Bytes(u"Hi")}}, {}}) {
    DictionaryTable table;
    Load(table, Image1_5(0, Grouped(entries)));
    const auto groups = entries.empty() ? std::vector<ImageGroup>{{0, {}}} : Grouped(entries);
    EXPECT_EQ(Written(table, BinaryVersion::k1_5, TextEncoding::kUTF16LE), Image1_5(0, groups));
    EXPECT_EQ(Written(table, BinaryVersion::k1_0, TextEncoding::kUTF16LE), Image1_0(0, groups));
  }
}

TEST(WriterTest, NamesTheValuesEncoding) {
  DictionaryTable table;
  Load(table, Image1_5(0, Grouped({{"/a", Bytes(u"Hié")}})));
  EXPECT_EQ(Written(table, BinaryVersion::k1_5, TextEncoding::kUTF8), Image1_5(1, Grouped({{"/a", "Hi\xC3\xA9"}})));
  EXPECT_EQ(Written(table, BinaryVersion::k1_0, TextEncoding::kCodePage), Image1_0(2, Grouped({{"/a", "Hi\xE9"}})));
}

TEST(WriterTest, LeavesOutWhatNoLookupFinds) {
  DictionaryTable table;
  Load(table, Image1_5(0, {{7, {{"/a", Bytes(u"misfiled")}}}, {580, {{"/a", Bytes(u"found") + "?"}, {"/a", Bytes(u"hidden")}}}}));
  EXPECT_EQ(Written(table, BinaryVersion::k1_5, TextEncoding::kUTF16LE), Image1_5(0, {{580, {{"/a", Bytes(u"found")}}}}));
}

TEST(WriterTest, NamesWhatAnEncodingCannotCarry) {
  DictionaryTable table;
  Load(table, Image1_5(0, Grouped({{"/a", Bytes(u"plain")}, {"/b", Bytes(u"ż")}, {"/c", Bytes(u"ab\xD800")}})));
  std::ostringstream image;
  const auto lost = WriteBinary(table, BinaryVersion::k1_5, TextEncoding::kUTF8, image);
  ASSERT_EQ(lost.size(), 1u);
  EXPECT_EQ(Text(lost[0].entry->Value()), u"ab\xD800");
  EXPECT_EQ(lost[0].unit, 2u);
  EXPECT_EQ(image.str(), "");
  EXPECT_EQ(Written(table, BinaryVersion::k1_0, TextEncoding::kCodePage, 2), "");
}

TEST(WriterTest, RandomDictionariesComeBack) {
  std::mt19937 random(7);
  size_t lines = 0, unwritable = 0, lossless = 0;
  for (int round = 0; round < 400; ++round) {
    DictionaryTable table;
    auto entries = RandomEntries(random);
    Load(table, Image1_5(0, Grouped(entries)));
    const Answers answers = AnswersOf(table);
    const std::string image = Written(table, BinaryVersion::k1_5, TextEncoding::kUTF16LE);
    for (const BinaryVersion version : {BinaryVersion::k1_5, BinaryVersion::k1_0}) {
      for (const TextEncoding values : {TextEncoding::kUTF16LE, TextEncoding::kUTF8, TextEncoding::kCodePage}) {
        std::ostringstream stream;
        const auto lost = WriteBinary(table, version, values, stream);
        lossless += lost.empty();
        if (!lost.empty()) continue;
        DictionaryTable back;
        Load(back, stream.str());
        EXPECT_TRUE(back.LastLoad().Complete());
        EXPECT_EQ(AnswersOf(back), answers);
        EXPECT_EQ(Written(back, BinaryVersion::k1_5, TextEncoding::kUTF16LE), image);
      }
    }
    Answers written;
    DictionaryTable back;
    Load(back, AsText(table, written));
    EXPECT_EQ(AnswersOf(back), written);
    lines += written.size();
    unwritable += answers.size() - written.size();
  }
  EXPECT_GT(lines, 1000u);
  EXPECT_GT(unwritable, 1000u);
  EXPECT_GT(lossless, 900u);
}

// The order of an image does not depend on that of the definitions, and text holds every value.
TEST(WriterTest, RealTranslationsComeBack) {
  size_t images = 0;
  for (const auto& file : std::filesystem::directory_iterator(ISO_CODES_FOLDER)) {
    std::ifstream stream(file.path(), std::ios::binary);
    DictionaryTable table, back;
    Load(table, {std::istreambuf_iterator<char>(stream), {}});
    const std::string image = Written(table, BinaryVersion::k1_5, TextEncoding::kUTF8);
    Answers written;
    Load(back, AsText(table, written));
    EXPECT_EQ(written, AnswersOf(table));
    EXPECT_EQ(Written(back, BinaryVersion::k1_5, TextEncoding::kUTF8), image);
    ++images;
  }
  EXPECT_EQ(images, 10u);
}

TEST(WriterTest, NamesWhatCannotBeSeen) {
  std::vector<uint16_t> line;
  const std::u16string value = u"\u00A0\u00AD\u2002\u2003\u2009\u200C\u200D\u200E\u200F";
  AppendLine({}, Units(value), line);
  EXPECT_EQ(std::u16string(line.begin(), line.end()), u"\"$$$=#{nbsp}#{shy}#{ensp}#{emsp}#{thinsp}#{zwnj}#{zwj}#{lrm}#{rlm}\"");
}

TEST(WriterTest, SaysWhyThereIsNoLine) {
  const auto obstacle = [](const std::string& key, const std::u16string& value) {
    std::vector<uint16_t> line;
    const auto* bytes = reinterpret_cast<const uint8_t*>(key.data());
    return AppendLine({bytes, key.size()}, Units(value), line);
  };
  using enum LineObstacle;
  EXPECT_EQ(obstacle("/a\\\"b", u"#{bogus} #{amp"), kNone);
  for (const std::string& key : {std::string("a=b"), std::string("\""), std::string("a\n"), std::string("a\0", 2)}) {
    EXPECT_EQ(obstacle(key, u""), kKey);
  }
  EXPECT_EQ(obstacle("/a", std::u16string(1, u'\0')), kZeroCharacter);
  EXPECT_EQ(obstacle("/a", u"\u2029"), kLineSeparator);
  EXPECT_EQ(obstacle("/a", u"##{endl}"), kNamedCharacter);
}
