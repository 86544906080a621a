// Strings, items, and the table with its chains and index.
#include <gtest/gtest.h>

#include "kolvane/lib/Converters.h"
#include "kolvane/lib/DictionaryTable.h"
#include "kolvane/lib/OVErrException.h"
#include "tests/kolvane/lib/Support.h"

namespace {

using namespace tovali_private;

EntryMemory gMemory;

std::unique_ptr<DictionaryEntry> Entry(const std::string& key, const std::u16string& value) {
  const std::string bytes = Bytes(value);
  return DictionaryEntry::Create(gMemory, Key(key), {reinterpret_cast<const uint8_t*>(bytes.data()), bytes.size()});
}

TEST(KolvaneString, SharesItsBytes) {
  const uint8_t bytes[] = {'a', 0, 'b', 0, 'c'};
  KolvaneString odd(bytes, 5);
  EXPECT_EQ(odd.Length(), 2u);
  EXPECT_EQ(odd.ByteLength(), 5u);
  KolvaneString other;
  {
    KolvaneString copy(odd);
    other = copy;
    other = copy;
    EXPECT_EQ(other.Data(), odd.Data());
    odd = KolvaneString();
  }
  other = *&other;  // the only handle by now
  EXPECT_EQ(Text(other), u"ab");
  EXPECT_EQ(odd.Data(), nullptr);
  EXPECT_EQ(odd.Length(), 0u);
}

TEST(ByteRunKey, HashesAndComparesBytes) {
  struct {
    const char* key;
    uint32_t bucket;
  } const cases[] = {{"", 0},
                     {"a", 97},
                     {"/a", 580},
                     {"abcde", 606},
                     {"/Menu/File/Open", 243},
                     {"/Dialog/OK", 929},
                     {"0123456789", BucketOf("0x2x4x6x8x")}};
  for (const auto& each : cases) EXPECT_EQ(Key(each.key).Hash(1021), each.bucket) << each.key;
  EXPECT_TRUE(Key("ab").Equals(Key("ab")));
  EXPECT_TRUE(Key("").Equals(Key("")));
  EXPECT_FALSE(Key("ab").Equals(Key("abc")));
  EXPECT_FALSE(Key("/A").Equals(Key("/a")));
  const uint8_t bytes[] = {'k'};
  const ByteRunKey probe(bytes, 1, false);
  EXPECT_EQ(probe.Bytes().data(), bytes);
  EXPECT_TRUE(ByteRunKey(probe).Owns());
  EXPECT_EQ(ByteRunKey(bytes, 1, true).Bytes()[0], 'k');
  EXPECT_EQ(ByteRunKey(bytes, 0, true).Bytes().data(), nullptr);
}

std::string Written(const MemoryOutput& out) {
  return {out.Bytes().begin(), out.Bytes().end()};
}

TEST(DictionaryEntry, WritesItself) {
  const int utf8 = 1, codePage = 2;
  struct {
    bool binary;
    const int* selector;
    const char* key;
    const char16_t* value;
    std::string written;
  } const cases[] = {
      {false, nullptr, "/a", u"say \"hi\"", Bytes(u"\"/a=say \\\"hi\\\"\"\r\n")},
      {false, nullptr, "\xE9", u"a\nb^", Bytes(u"\"\u00E9=a\\nb^\"\r\n")},
      {false, nullptr, "", u"x", Bytes(u"x\"\r\n")},
      {true, nullptr, "/a", u"\u20AC", "/a\xAC\x20"},
      {true, nullptr, "/a", u"", "/a"},
      {true, &utf8, "/a", u"\u20AC", "/a\xE2\x82\xAC"},
      {true, &codePage, "/a", u"\u20AC\u0416", "/a\x80?"},
      {true, &utf8, "", u"", ""},
  };
  for (const auto& each : cases) {
    SCOPED_TRACE(&each - cases);
    const auto entry = Entry(each.key, each.value);
    MemoryOutput whole, parts;
    EXPECT_EQ(entry->Write(whole, each.binary, each.selector), each.written.size());
    EXPECT_EQ(entry->WriteKey(parts, each.binary, each.selector) + entry->WriteValue(parts, each.binary, each.selector),
              each.written.size());
    EXPECT_EQ(Written(whole), each.written);
    EXPECT_EQ(Written(parts), each.written);
  }
  EXPECT_EQ(Entry("/abc", u"xyz")->SerializedSize(), 10u);
  MemoryOutput odd;
  const uint8_t bytes[] = {'H', 0, 'i'};
  DictionaryEntry::Create(gMemory, Key("/a"), bytes)->Write(odd, true, nullptr);
  EXPECT_EQ(Written(odd), std::string("/aH\0i", 5));
}

template <class Conversion>
uint32_t CodeOf(const Conversion& conversion) {
  try {
    conversion();
  } catch (const OVErrException& error) {
    return error.Code();
  }
  return 0;
}

TEST(Converters, GuardTheirBuffers) {
  const auto units = Units(u"\u20ACuro");
  const int utf8 = 1, other = 2;
  const int size = CountMultiByte(units.data(), units.size(), &utf8);
  EXPECT_EQ(size, 7);
  for (int room = 0; room <= 8; ++room) {
    std::vector<char> exact(static_cast<size_t>(room));
    const auto convert = [&] { ConvertToMultiByte(units.data(), units.size(), exact.data(), room, &utf8); };
    EXPECT_EQ(CodeOf(convert), room < size ? kErrorBufferTooSmall : 0) << room;
    EXPECT_TRUE(room < size || exact.data() == std::string("\xE2\x82\xACuro")) << room;
  }
  char one = 'x';
  EXPECT_EQ(CodeOf([&] { ConvertToMultiByte(units.data(), 0, nullptr, 8); }), kErrorBufferTooSmall);
  EXPECT_EQ(CodeOf([&] { ConvertToMultiByte(units.data(), 0, &one, 1); }), 0u);
  EXPECT_EQ(one, 0);

  UnicodeBuffer buffer;
  ConvertToUnicode("", 0, buffer);
  EXPECT_EQ(buffer.Length(), 0u);
  ConvertToUnicode("\x80uro", 4, buffer, &other);
  EXPECT_EQ(buffer.Length(), 4u);
  EXPECT_EQ(buffer.Data()[0], 0x20AC);
  EXPECT_EQ(MultiByteToUnicode(nullptr, 1, buffer.Data(), 8, nullptr), kErrorConversionFailed);
  EXPECT_EQ(MultiByteToUnicode("text", 4, buffer.Data(), 3, nullptr), kErrorBufferTooSmall);
}

TEST(Converters, CallThroughTheTableAndThrowItsCodes) {
  const ConverterTable working = gConverterTable;
  gConverterTable = {[](const char*, int, int* count, const int*) noexcept { return uint32_t(*count = 1); },
                     [](const char*, int, uint16_t*, int, const int*) noexcept { return 2u; },
                     [](const uint16_t*, int, int* count, const int*) noexcept { return uint32_t(*count = 3); },
                     [](const uint16_t*, int, char*, int, int* written, const int*) noexcept { return uint32_t(*written = 4); }};
  UnicodeBuffer buffer;
  char bytes[8];
  const uint16_t unit = 'x';
  const auto decode = [&] { ConvertToUnicode("text", 4, buffer); };
  EXPECT_EQ(CodeOf(decode), 1u);
  EXPECT_EQ(CodeOf([&] { CountMultiByte(&unit, 1); }), 3u);
  EXPECT_EQ(CodeOf([&] { ConvertToMultiByte(&unit, 1, bytes, 8); }), 4u);
  gConverterTable.multiByteToUnicodeLength = working.multiByteToUnicodeLength;
  EXPECT_EQ(CodeOf(decode), 2u);
  EXPECT_EQ(buffer.Length(), 4u);  // the counted length, all the same
  gConverterTable = working;
}

TEST(GrowableBuffer, GrowsByHalfAndKeepsWhatItHolds) {
  UnicodeBuffer buffer;
  for (uint16_t i = 0; i < 300; ++i) buffer.Append(i);
  EXPECT_EQ(buffer.Capacity(), 384u);
  buffer.Reserve(600);
  EXPECT_EQ(buffer.Capacity(), 864u);
  EXPECT_EQ(buffer.Data()[299], 299);
  buffer.Clear();
  EXPECT_EQ(buffer.Capacity(), 864u);
}

}  // namespace
