// Dictionaries out, as images and as lines of text, and in again.
#include <gtest/gtest.h>

#include <sstream>

#include "kolvane/lib/DictionaryWriter.h"
#include "kolvane/lib/TextSyntax.h"
#include "tests/kolvane/lib/Support.h"

using namespace tovali_private;

namespace {

std::string Written(DictionaryTable& table, BinaryVersion version, TextEncoding values, size_t lost = 0) {
  std::ostringstream image;
  EXPECT_EQ(WriteBinary(table, version, values, image).size(), lost);
  return image.str();
}

}  // namespace

TEST(WriterTest, LaysImagesOut) {
  const std::vector<ImageGroup> found = {{580, {{"/a", Bytes(u"Hié")}}}}, none = {{0, {}}};
  const std::vector<ImageGroup> hidden = {{7, {{"/a", Bytes(u"misfiled")}}},
                                          {580, {{"/a", Bytes(u"Hié") + "?"}, {"/a", Bytes(u"hidden")}}}};
  const std::pair<std::string, std::string> one = {"0A2_4_6_8_", ""}, other = {"0B2_4_6_8_", ""};  // of a bucket
  const auto bucket = static_cast<uint16_t>(BucketOf(one.first));
  struct {
    std::vector<ImageGroup> loaded;
    TextEncoding values;
    std::vector<ImageGroup> written;
    int encodingByte;
  } const cases[] = {
      {{}, TextEncoding::kUTF16LE, none, 0},
      {found, TextEncoding::kUTF16LE, found, 0},
      {hidden, TextEncoding::kUTF16LE, found, 0},
      {{{bucket, {other, one}}}, TextEncoding::kUTF16LE, {{bucket, {one, other}}}, 0},
      {found, TextEncoding::kUTF8, {{580, {{"/a", "Hi\xC3\xA9"}}}}, 1},
      {found, TextEncoding::kCodePage, {{580, {{"/a", "Hi\xE9"}}}}, 2},
  };
  for (const auto& each : cases) {
    SCOPED_TRACE(&each - cases);
    DictionaryTable table;
    Load(table, Image1_5(0, each.loaded));
    EXPECT_EQ(Written(table, BinaryVersion::k1_5, each.values), Image1_5(each.encodingByte, each.written));
    EXPECT_EQ(Written(table, BinaryVersion::k1_0, each.values), Image1_0(each.encodingByte, each.written));
  }
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
  using enum UnwritableReason;
  EXPECT_EQ(obstacle("/a\\\"b", u"#{bogus} #{amp"), kNone);
  for (const std::string& key : {std::string("a=b"), std::string("\""), std::string("a\n"), std::string("a\0", 2)}) {
    EXPECT_EQ(obstacle(key, u""), kKey);
  }
  EXPECT_EQ(obstacle("/a", std::u16string(1, u'\0')), kZeroCharacter);
  EXPECT_EQ(obstacle("/a", u"\u2029"), kLineSeparator);
  EXPECT_EQ(obstacle("/a", u"##{endl}"), kNamedCharacter);
}
