// Images in: readers, both binary versions, and every kind of damage.
#include <gtest/gtest.h>

#include <algorithm>
#include <boost/interprocess/streams/bufferstream.hpp>
#include <cstdio>
#include <fstream>
#include <optional>
#include <random>
#include <sstream>
#include <stdexcept>
#include <streambuf>

#include "kolvane/lib/Converters.h"
#include "kolvane/lib/DictionaryReader.h"
#include "kolvane/lib/OVErrException.h"
#include "tests/FaultSweep.h"
#include "tests/kolvane/lib/SlowTwin.h"
#include "tests/kolvane/lib/Support.h"

namespace {

using namespace tovali_private;

std::vector<std::u16string> Lines(DictionaryReader& reader) {
  std::vector<std::u16string> lines;
  while (const uint16_t* line = reader.GetNextLine()) {
    EXPECT_EQ(line[reader.LineLength()], 0);
    lines.emplace_back(line, line + reader.LineLength());
  }
  return lines;
}

// Inputs that are too short for an image, and what a reader goes on with after its end.
TEST(DictionaryReader, DeliversLines) {
  using namespace std::string_literals;
  struct {
    std::string input;
    std::vector<std::u16string> lines, after;
  } const cases[] = {
      {"", {}, {}},
      {"a", {u"a"}, {}},
      {"ab\0c\n\0d"s, {u"ab", u"c"}, {u"d"}},
      {LittleEndianImage(u""), {}, {}},
      {LittleEndianImage(u"a") + "\0\0b\0\n\0\0\0c"s, {u"a", u"b"}, {u"c"}},
      {BigEndianImage(u"a") + "b", {u"a\u6200"}, {}},
  };
  for (const auto& each : cases) {
    SCOPED_TRACE(&each - cases);
    MemoryInput stream(each.input);
    const auto reader = DictionaryReader::Create(&stream);
    EXPECT_EQ(Lines(*reader), each.lines);
    EXPECT_EQ(Lines(*reader), each.after);
  }
  EXPECT_EQ(DictionaryReader::Create(nullptr)->GetNextLine(), nullptr);
}

// The same dictionary in every form an image can have.
std::vector<std::string> ValidImages() {
  const std::u16string text = u"\"$$$/a=H\u00E4\"\r\n\n\"$$$/b=x^ny\" z\n\"$$/c=d\"\n\"$$$/a=\u20AC\"";
  std::string codePage;
  for (const char16_t unit : text) codePage += unit == u'\u20AC' ? '\x80' : static_cast<char>(unit);
  std::vector<std::string> images = {LittleEndianImage(text), BigEndianImage(text), codePage};
  for (const int encoding : {0, 1, 2}) {
    const std::string value = encoding == 0 ? Bytes(u"H\u00E4") : encoding == 1 ? "H\xC3\xA4" : "H\xE4";
    const std::vector<ImageGroup> groups = {{580, {{"/a", value}, {"/a", ""}}}, {581, {{"/b", value}}}, {7, {}}, {580, {{"/a", value}}}};
    images.push_back(Image1_5(encoding, groups));
    images.push_back(Image1_0(encoding, groups));
  }
  return images;
}

// What LastLoad tells.
TEST(Load, TellsHowItWent) {
  using namespace std::string_literals;
  const auto damaged = [](std::string image, size_t at, const std::string& bytes) { return image.replace(at, bytes.size(), bytes); };
  const std::string one15 = Image1_5(0, {{580, {{"/a", Bytes(u"Hi")}}}});
  const std::string one10 = Image1_0(0, {{580, {{"/a", Bytes(u"Hi")}}}});
  const std::string two15 = Image1_5(1, {{580, {{"/a", "x"}}}, {581, {{"/b", "y"}}}});
  const std::string two10 = Image1_0(9, {{580, {{"/a", "x"}}}, {581, {{"/b", "y"}}}});
  ASSERT_EQ(one15, "Kolvane Binary Format\1\5\0\1\0\0\0\2\0\0\0\2\0\0\0\4\0\0\0\x44\2/aH\0i\0"s);
  ASSERT_EQ(one10, "Kolvane Binary Format\1\0\0\2\0\x44\2\x26\0\0\0\0\0\x34\0\0\0\2\0\0\0/a\4\0\0\0H\0i\0"s);
  const std::vector<ImageGroup> misplaced = {{580, {{"/a", "x"}, {"/ccc", "x"}, {"/d", "x"}}}};  // the last two, that is
  const std::string misplaced15 = Image1_5(0, misplaced), misplaced10 = Image1_0(9, misplaced);
  const std::string line = "\"$$$/a=a line of text\"\n";
  struct {
    std::string image;
    ImageFormat format;
    TextEncoding encoding;
    uint32_t added, replaced, dropped;
    LoadDamage damage;
    uint64_t offset;
  } const cases[] = {
      {"", ImageFormat::kNone, TextEncoding::kCodePage, 0, 0, 0, LoadDamage::kTooShort, 0},
      {LittleEndianImage(u"\"$$$/a=b\""), ImageFormat::kNone, TextEncoding::kCodePage, 0, 0, 0, LoadDamage::kTooShort, 0},
      {LittleEndianImage(u"\"$$$/a=b\"\r\n"), ImageFormat::kText, TextEncoding::kUTF16LE, 1, 0, 0, LoadDamage::kNone, 0},
      {line + line + "$x\n", ImageFormat::kText, TextEncoding::kCodePage, 2, 1, 1, LoadDamage::kNone, 0},
      {line + "\0"s, ImageFormat::kText, TextEncoding::kCodePage, 1, 0, 0, LoadDamage::kNone, 0},
      {line + "\0x"s, ImageFormat::kText, TextEncoding::kCodePage, 1, 0, 0, LoadDamage::kZeroCharacter, 23},
      {BigEndianImage(u"\"$$$/abcdef=b\"\n") + "\0\0x"s, ImageFormat::kText, TextEncoding::kUTF16BE, 1, 0, 0, LoadDamage::kZeroCharacter,
       32},
      {one15, ImageFormat::kBinary1_5, TextEncoding::kUTF16LE, 1, 0, 0, LoadDamage::kNone, 0},
      {one10, ImageFormat::kBinary1_0, TextEncoding::kUTF16LE, 1, 0, 0, LoadDamage::kNone, 0},
      {one15 + "behind", ImageFormat::kBinary1_5, TextEncoding::kUTF16LE, 1, 0, 0, LoadDamage::kNone, 0},
      {two15, ImageFormat::kBinary1_5, TextEncoding::kUTF8, 2, 0, 0, LoadDamage::kNone, 0},
      {two10, ImageFormat::kBinary1_0, TextEncoding::kCodePage, 2, 0, 0, LoadDamage::kNone, 0},
      {two15.substr(0, two15.size() - 1), ImageFormat::kBinary1_5, TextEncoding::kUTF8, 1, 0, 0, LoadDamage::kShortRead, two15.size() - 1},
      {damaged(one15, 21, "\1\7"), ImageFormat::kBinaryOther, TextEncoding::kUTF16LE, 0, 0, 0, LoadDamage::kUnsupportedVersion, 21},
      {damaged(one15, 24, "\xFF\xFF\xFF\xFF"), ImageFormat::kBinary1_5, TextEncoding::kUTF16LE, 0, 0, 0, LoadDamage::kShortRead, 28},
      {damaged(one15, 24, "\0\0\0\0"s), ImageFormat::kBinary1_5, TextEncoding::kUTF16LE, 0, 0, 0, LoadDamage::kNoGroups, 24},
      {damaged(one10, 24, "\0\0"s), ImageFormat::kBinary1_0, TextEncoding::kUTF16LE, 0, 0, 0, LoadDamage::kNoGroups, 24},
      {damaged(two15, 28, "\1"), ImageFormat::kBinary1_5, TextEncoding::kUTF8, 0, 0, 0, LoadDamage::kBadCounts, 28},
      {damaged(two15, 28, "\6"), ImageFormat::kBinary1_5, TextEncoding::kUTF8, 0, 0, 0, LoadDamage::kBadCounts, 28},
      {damaged(two15, 36, "\xFF\xFF\xFF\xFF"), ImageFormat::kBinary1_5, TextEncoding::kUTF8, 0, 0, 0, LoadDamage::kShortRead, 56},
      {damaged(two15, 52, "\xFD\3"), ImageFormat::kBinary1_5, TextEncoding::kUTF8, 1, 0, 0, LoadDamage::kBadBucket, 52},
      {damaged(two10, 26, "\xFD\3"), ImageFormat::kBinary1_0, TextEncoding::kCodePage, 1, 0, 0, LoadDamage::kBadBucket, 26},
      {damaged(two15, 52, "\x45\2"), ImageFormat::kBinary1_5, TextEncoding::kUTF8, 2, 0, 0, LoadDamage::kWrongBucket, 56},
      {damaged(two15, 52, "\xFD\3").substr(0, two15.size() - 1), ImageFormat::kBinary1_5, TextEncoding::kUTF8, 0, 0, 0,
       LoadDamage::kShortRead, two15.size() - 1},
      {misplaced15, ImageFormat::kBinary1_5, TextEncoding::kUTF16LE, 3, 0, 0, LoadDamage::kWrongBucket, misplaced15.size() - 8},
      {misplaced10, ImageFormat::kBinary1_0, TextEncoding::kCodePage, 3, 0, 0, LoadDamage::kWrongBucket, misplaced10.size() - 20},
      {LittleEndianImage(u"\"$$$/abcdef=b\"\n") + "x", ImageFormat::kText, TextEncoding::kUTF16LE, 2, 0, 0, LoadDamage::kHalfUnit, 32},
      {damaged(two10, 34, "\x2D"), ImageFormat::kBinary1_0, TextEncoding::kCodePage, 2, 0, 0, LoadDamage::kBadOffset, 34},
      {damaged(damaged(two10, 34, "\x2D"), 26, "\xFD\3"), ImageFormat::kBinary1_0, TextEncoding::kCodePage, 1, 0, 0, LoadDamage::kBadBucket,
       26},
  };
  for (const auto& each : cases) {
    SCOPED_TRACE(&each - cases);
    DictionaryTable table;
    Load(table, "\"$$$/before=something to forget\"\n$x\n");
    Load(table, each.image);
    const LoadStatus& status = table.LastLoad();
    EXPECT_EQ(status.format, each.format);
    EXPECT_EQ(status.encoding, each.encoding);
    EXPECT_EQ(status.entriesAdded, each.added);
    EXPECT_EQ(status.entriesReplaced, each.replaced);
    EXPECT_EQ(status.linesDropped, each.dropped);
    EXPECT_EQ(status.damage, each.damage);
    EXPECT_EQ(status.damageOffset, each.offset);
    EXPECT_EQ(status.Complete(), each.damage == LoadDamage::kNone);
  }
}

int gConversionsLeft = 0;

uint32_t ConvertWhileAnyAreLeft(const char* text, int byteCount, uint16_t* units, int capacity, const int* selector) noexcept {
  return gConversionsLeft-- == 0 ? 42 : MultiByteToUnicode(text, byteCount, units, capacity, selector);
}

// What was loaded before stays, and of a binary image the entries before the value.
TEST(Load, EndsWhereAConversionFails) {
  const std::string line = "\"$$$/a=a line of text\"\n";
  const std::string binary = Image1_5(1, {{580, {{"/a", "x"}, {"/a", "y"}, {"/a", "z"}}}});
  const ConverterTable working = gConverterTable;
  struct {
    std::string image;
    int conversions;
    std::u16string answer;
    uint64_t offset;
  } const cases[] = {{line, 0, u"before", 0}, {binary, 0, u"before", 58}, {binary, 1, u"x", 61}};
  for (const auto& each : cases) {
    SCOPED_TRACE(&each - cases);
    DictionaryTable table;
    Load(table, "\"$$$/a=before\"\n\n\n\n\n\n\n");
    gConverterTable.multiByteToUnicode = ConvertWhileAnyAreLeft;
    gConversionsLeft = each.conversions;
    try {
      Load(table, each.image);
      ADD_FAILURE() << "nothing was thrown";
    } catch (const OVErrException& error) {
      EXPECT_EQ(error.Code(), 42u);
    }
    gConversionsLeft = 0;
    EXPECT_THROW(Translated(table, "$$$/b=\xC3\xA9"), OVErrException);
    gConverterTable = working;
    EXPECT_EQ(table.LastLoad().damage, LoadDamage::kInterrupted);
    EXPECT_EQ(table.LastLoad().damageOffset, each.offset);
    EXPECT_EQ(Translated(table, "$$$/a=none"), each.answer);
    Load(table, each.image);
    EXPECT_TRUE(table.LastLoad().Complete());
  }
}

constexpr int kNoSelector = 1 << 20;
std::vector<int> gSelectors;

uint32_t CountNotingSelector(const char* text, int byteCount, int* unitCount, const int* selector) noexcept {
  gSelectors.push_back(selector != nullptr ? *selector : kNoSelector);
  return MultiByteToUnicodeLength(text, byteCount, unitCount, selector);
}
uint32_t ConvertNotingSelector(const char* text, int byteCount, uint16_t* units, int capacity, const int* selector) noexcept {
  gSelectors.push_back(selector != nullptr ? *selector : kNoSelector);
  return MultiByteToUnicode(text, byteCount, units, capacity, selector);
}

TEST(Load, ConvertsValuesByTheEncodingByte) {
  const ConverterTable working = gConverterTable;
  gConverterTable.multiByteToUnicodeLength = CountNotingSelector;
  gConverterTable.multiByteToUnicode = ConvertNotingSelector;
  for (const auto& image : {Image1_5, Image1_0}) {
    for (const int encoding : {1, 2, 0x7F, -0x80, -1}) {
      DictionaryTable table;
      gSelectors.clear();
      Load(table, image(encoding, {{580, {{"/a", "x"}}}}));
      EXPECT_EQ(gSelectors, std::vector<int>(2, encoding));
    }
  }
  gConverterTable = working;
}

TEST(Load, PutsOffWhatNobodyAskedFor) {
  const std::string binary = Image1_5(0, {{580, {{"/a", Bytes(u"x")}, {"/a", Bytes(u"y")}}}});
  DictionaryTable defaults, other;
  Load(defaults, binary);
  defaults.MakeDefault();
  EXPECT_EQ(Translated(other, "$$$/a=none"), u"x");
  Load(other, binary);
  Load(other, Image1_5(0, {{581, {{"/b", Bytes(u"x")}}}}));
  EXPECT_EQ(other.LastLoad().entriesReplaced, 0u);  // by this load
  Load(other, binary);
  other.Clear();
  EXPECT_TRUE(ContentsOf(other).empty());
}

// A line for a key that hides another one, when there is no room left in the index.
TEST(Load, StoresALineWholeOrNotAtAll) {
  const std::string key = "0A2_4_6_8_";
  ImageGroup group = {static_cast<uint16_t>(BucketOf(key)), {}};
  for (char other = 'B'; other <= 'X'; ++other) group.entries.emplace_back(std::string(key).replace(1, 1, 1, other), Bytes(u"x"));
  group.entries.insert(group.entries.end(), 2, {key, Bytes(u"y")});
  const std::string image = Image1_5(0, {group});
  SweepFaults(2, [&](Fault& fault) {
    DictionaryTable table, untouched;
    Load(table, image);
    Load(untouched, image);
    const auto line = Units(u"0A2_4_6_8_=new");
    bool threw = false;
    {
      const AllocationMeter meter(fault);
      try {
        table.StoreLine(line);
      } catch (const std::bad_alloc&) {
        threw = true;
      }
    }
    ASSERT_EQ(threw, fault.hasFired);
    ASSERT_EQ(ContentsOf(table) == ContentsOf(untouched), threw);
  });
}

// Whatever allocation fails, the table keeps only whole entries, and the next load is as good as
// new.
TEST(Load, SurvivesEveryFailedAllocation) {
  for (const std::string& image : ValidImages()) {
    SlowTwin twin;
    Contents possible;  // after the whole image or any number of its lines
    for (size_t length = 1; length <= image.size(); ++length) {
      if (length != image.size() && image[length - 1] != '\n') continue;
      twin = {};
      twin.Load(image.substr(0, length));
      const Contents contents = twin.AllContents();
      possible.insert(possible.end(), contents.begin(), contents.end());
    }
    SweepFaults(7, [&](Fault& fault) {
      DictionaryTable table;
      bool loaded = false;
      boost::interprocess::ibufferstream stream(image.data(), image.size());
      {
        const AllocationMeter meter(fault);
        try {
          table.Load(stream);
          loaded = true;
          table.Translate("$$$/none=x^ny", nullptr);
          table.LastLoad();  // looks into every bucket
        } catch (const std::bad_alloc&) {
        }
      }
      if (loaded) {
        ASSERT_EQ(ContentsOf(table), twin.AllContents());
      }
      for (const auto& entry : ContentsOf(table)) {
        ASSERT_NE(std::find(possible.begin(), possible.end(), entry), possible.end());
      }
      Load(table, image);
      for (const auto& [bucket, key, value] : twin.AllContents()) {
        ASSERT_EQ(Translated(table, key.c_str()), twin.Translate(key));
      }
    });
  }
}

// Dictionaries that are loaded over and over again, each time with a key that never comes again, and
// a translation that outlives its own.
TEST(Load, KeepsLittleMemoryOfWhatItReplaced) {
  std::string first, second;
  for (int i = 0; i < 500; ++i) (i < 250 ? first : second) += "\"$$$/key" + std::to_string(i) + "=value " + std::to_string(i) + "\"\n";
  const AllocationMeter meter;
  {
    std::optional<TranslatedString> kept;
    {
      DictionaryTable table;
      for (int round = 0; round < 600; ++round) {
        const std::string image = first + "\"$$$/" + std::to_string(round) + "=x\"\n" + second;
        boost::interprocess::ibufferstream stream(image.data(), image.size());
        table.Load(stream);
        if (round == 100) kept.emplace(table.Translate("$$$/key77=none", nullptr));
        ASSERT_LT(meter.LiveBytes(), 4 * 150 * (500 + round) + 300'000) << round;
      }
    }
    EXPECT_LE(meter.LiveBlocks(), 2) << "its chunk, and what counts the chunks";
    uint16_t units[9];
    kept->CopyTo(units, 9, true);
    EXPECT_TRUE(std::equal(units, units + 9, u"value 77"));
  }
  EXPECT_EQ(meter.LiveBlocks(), 0);
}

TEST(Load, KeepsABinaryImageOnlyUntilItsEntriesAreMade) {
  const std::string image = Image1_5(0, Grouped({{"/a", std::string(1 << 20, 'x')}}));
  const AllocationMeter meter;
  DictionaryTable table;
  for (int round = 1; round <= 3; ++round) {
    Load(table, image);
    Translated(table, "$$$/a=none");
    EXPECT_LT(meter.LiveBytes(), round * (5 << 18));
  }
}

// Entries that hide others or lie in a wrong bucket, before a load that has all move.
TEST(Load, MovesEntriesAsFarAsThereIsMemory) {
  const std::string binary =
      Image1_5(0, {{580, {{"/a", Bytes(u"1")}, {"/a", Bytes(u"2")}, {"/b", Bytes(u"3")}, {"/a", ""}, {"/a", Bytes(u"5") + '!'}}}});
  std::string text = "\"$$$/a=6\"\n";
  for (int i = 0; i < 20; ++i) text += "\"$$$/k=" + std::string(4000, static_cast<char>('a' + i)) + "\"\n";
  SlowTwin twin;
  for (const std::string& image : {binary, binary, text}) twin.Load(image);
  SweepFaults(10, [&](Fault& fault) {
    DictionaryTable table;
    Load(table, binary);
    Load(table, binary);
    ASSERT_EQ(table.LastLoad().entriesReplaced, 4u);
    const TranslatedString kept = table.Translate("$$$/a", nullptr);
    boost::interprocess::ibufferstream stream(text.data(), text.size());
    {
      const AllocationMeter meter(fault);
      try {
        table.Load(stream);
      } catch (const std::bad_alloc&) {
      }
    }
    if (table.LastLoad().damage == LoadDamage::kInterrupted) return;
    ASSERT_EQ(ContentsOf(table), twin.AllContents());
    for (const char16_t* const value : {u"6", u"2", u"", u"5", u"1", u"2", u"", u"5"}) {
      const auto detached = table.Detach(Key("/a"));
      ASSERT_NE(detached, nullptr);
      ASSERT_EQ(Text(detached->Value()), value);
      ASSERT_EQ(detached->Value().ByteLength() % 2, *value == u'5' ? 1u : 0u);
    }
    uint16_t units[2];
    kept.CopyTo(units, 2, true);
    ASSERT_EQ(units[0], '1');
  });
}

// Seeks to its end only if it may, and fails once, after its first bytes.
class PickyBuffer : public std::streambuf {
 public:
  PickyBuffer(std::string& image, size_t readable, bool mayFindEnd) : size(image.size()), findsEnd(mayFindEnd) {
    setg(image.data(), image.data(), image.data() + readable);
  }

 protected:
  int_type underflow() override {
    if (egptr() == eback() + size) return traits_type::eof();
    setg(eback(), gptr(), eback() + size);
    throw std::runtime_error("unreadable");
  }
  pos_type seekoff(off_type offset, std::ios::seekdir from, std::ios::openmode) override {
    if (!findsEnd || offset != 0 || from == std::ios::beg) return off_type(-1);
    isAtEnd |= from == std::ios::end;
    return isAtEnd ? static_cast<off_type>(size) : gptr() - eback();
  }
  pos_type seekpos(pos_type to, std::ios::openmode) override {
    setg(eback(), eback() + off_type(to), egptr());
    isAtEnd = false;
    return to;
  }

 private:
  size_t size;
  bool findsEnd;
  bool isAtEnd = false;
};

void ExpectSameLoad(DictionaryTable& expected, std::istream& stream) {
  DictionaryTable table;
  table.Load(stream);
  EXPECT_EQ(ContentsOf(table), ContentsOf(expected));
  EXPECT_EQ(table.LastLoad().format, expected.LastLoad().format);
  EXPECT_EQ(table.LastLoad().damage, expected.LastLoad().damage);
  EXPECT_EQ(table.LastLoad().damageOffset, expected.LastLoad().damageOffset);
}

// Streams that hold all, a little, or nothing of what they read in memory, and that seek only to positions.
TEST(Load, ReadsEveryKindOfStream) {
  using namespace std::string_literals;
  const std::string path = testing::TempDir() + "kolvane-image" + std::to_string(std::random_device()());
  std::vector<std::string> images = ValidImages();
  for (size_t i = 0; i < 3; ++i) images.push_back(images[i] + images[i].substr(2) + images[i].substr(1));  // shifted by a byte
  for (const std::string& end : {"\n\0\0x"s, "\n\0\0"s, "x"s}) images.push_back(images[1] + end);
  for (std::string& image : images) {
    SCOPED_TRACE(&image - images.data());
    std::ofstream(path, std::ios::binary) << image;
    DictionaryTable expected;
    Load(expected, image);
    for (const std::streamsize held : {0, 1, 7, 8, 4096}) {
      SCOPED_TRACE(held);
      std::vector<char> memory(static_cast<size_t>(held));
      std::ifstream stream;
      stream.rdbuf()->pubsetbuf(held != 0 ? memory.data() : nullptr, held);
      stream.open(path, std::ios::binary);
      ExpectSameLoad(expected, stream);
    }
    PickyBuffer buffer(image, image.size(), false);
    std::istream stream(&buffer);
    ExpectSameLoad(expected, stream);
  }
  std::remove(path.c_str());
  std::istringstream failed(images[0]);
  failed.setstate(std::ios::failbit);
  DictionaryTable table;
  table.Load(failed);
  EXPECT_EQ(table.LastLoad().damage, LoadDamage::kTooShort);
}

TEST(Load, TellsThatAStreamFailed) {
  for (std::string& image : ValidImages()) {
    for (size_t readable = 0; readable < image.size(); ++readable) {
      for (const bool findsEnd : {false, true}) {
        PickyBuffer buffer(image, readable, findsEnd);
        std::istream stream(&buffer);
        DictionaryTable table;
        table.Load(stream);
        ASSERT_EQ(table.LastLoad().damage, LoadDamage::kInterrupted) << readable << " of " << image.size() << ' ' << findsEnd;
      }
    }
  }
}

}  // namespace
