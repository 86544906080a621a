// What hostile input can cost: memory and time in proportion to it, and sizes beyond 31 and 32 bits.
#include <gtest/gtest.h>

#include <algorithm>
#include <boost/interprocess/streams/bufferstream.hpp>
#include <chrono>
#include <ctime>
#include <functional>
#include <istream>
#include <limits>
#include <streambuf>

#include "kolvane/lib/Converters.h"
#include "kolvane/lib/OVErrException.h"
#include "kolvane/lib/TextSyntax.h"
#include "tests/AllocationMeter.h"
#include "tests/kolvane/lib/Support.h"

namespace {

using namespace tovali_private;
using namespace std::string_literals;

const std::string kHeader1_5 = "Kolvane Binary Format\1\5\0"s;
const std::string kHeader1_0 = "Kolvane Binary Format\1\0\0"s;

std::string Filled(std::string image, size_t size, const std::string& with) {
  while (image.size() < size) image += with;
  return image;
}

// Keys of one bucket, each different.
std::string CrowdingKey(size_t number) {
  std::string key = "0_2_4_6_8_0__";
  for (; number != 0; number /= 26) key += {'_', static_cast<char>('a' + number % 26)};
  key.resize(26, '_');
  return key;
}

std::string Lines(size_t size, const std::function<std::string(size_t)>& line) {
  std::string image;
  for (size_t i = 0; image.size() < size; ++i) image += line(i) + '\n';
  return image;
}

// Entries of one kind, all in one group or each in its own.
std::string Binary(size_t size, bool oneGroup, int encoding, uint16_t bucket,
                   const std::function<std::pair<std::string, std::string>(size_t)>& entry, decltype(Image1_5)* image = Image1_5) {
  std::vector<ImageGroup> groups;
  for (size_t taken = 0, i = 0; taken < size; ++i) {
    const auto [key, value] = entry(i);
    taken += key.size() + value.size() + (oneGroup ? 8 : 14);
    if (groups.empty() || !oneGroup) groups.push_back({bucket, {}});
    groups.back().entries.emplace_back(key, value);
  }
  return image(encoding, groups);
}

// Records of version 1.0 whose offsets go back to the start of the data again and again.
std::string RecordsOfTheSameEntries(size_t size) {
  const size_t count = size / 12;
  const size_t dataAt = kHeader1_0.size() + 2 + 6 * count;
  std::string image = kHeader1_0 + Little(count, 2);
  for (size_t i = 0; i < count; ++i) image += Little(i, 2) + Little(dataAt + i % 2 * size, 4);
  return image + std::string(size / 2, '\0');
}

struct Shape {
  const char* name;
  std::function<std::string(size_t)> make;
  size_t imageSize = 0;  // where an image is many of this size, one after the other
};

const auto kNothing = [](size_t) { return std::pair(""s, ""s); };
const auto kSameKey = [](size_t) { return std::pair("/a"s, ""s); };

const auto kCrowdingKeys = [](size_t number) { return std::pair(CrowdingKey(number), ""s); };
const auto kCrowd = static_cast<uint16_t>(BucketOf(CrowdingKey(1)));
const std::string kSmallImage = Image1_5(0, {{580, {{"/a", ""}}}});

const Shape kShapes[] = {
    {"one line", [](size_t size) { return std::string(size, 'x'); }},
    {"one line in UTF-16", [](size_t size) { return Filled("\xFF\xFE", size, "x\0"s); }},
    {"one key in UTF-16, swapped", [](size_t size) { return Filled("\xFE\xFF", size, "\0$"s); }},
    {"one value", [](size_t size) { return Filled("\"$$$/k=", size, "\x80"); }},
    {"a line of escapes", [](size_t size) { return Filled("\"$$$/k=", size, "^^\\n\\\""); }},
    {"a line of names", [](size_t size) { return Filled("\"$$$/k=", size, "#{lt}"); }},
    {"a line of what is no name", [](size_t size) { return Filled("\"$$$/k=", size, "#{yuml#{yumx}"); }},
    {"a line of names begun", [](size_t size) { return Filled("\"$$$/k=", size, "#{"); }},
    {"a line of quotes", [](size_t size) { return Filled("\"", size, "\\\""); }},
    {"line ends", [](size_t size) { return std::string(size, '\n'); }},
    {"line ends in UTF-16", [](size_t size) { return Filled("\xFF\xFE", size, "\x28\x20"); }},
    {"zeros", [](size_t size) { return Filled("\"$$$/a=some text here\"\n", size, "a\0"s); }},
    {"dropped lines", [](size_t size) { return Filled("", size, "$\n"); }},
    {"lines of a byte", [](size_t size) { return Filled("", size, "a\nb\nc\nd\ne\nf\ng\nh\n"); }},
    {"lines of one key, and others",
     [](size_t size) { return Lines(size, [](size_t i) { return i % 99 == 0 ? std::to_string(i) : "k"s; }); }},
    {"short lines", [](size_t size) { return Lines(size, [](size_t i) { return Little(0x10101 + i * 2, 3); }); }},
    {"keys of one bucket", [](size_t size) { return Lines(size, [](size_t i) { return CrowdingKey(i) + "=x"; }); }},
    {"a count of groups that is not so", [](size_t size) { return kHeader1_5 + std::string(size, '\xFF'); }},
    {"a count of lengths that is not so", [](size_t size) { return kHeader1_5 + Little(1, 4) + std::string(size, '\x7F'); }},
    {"lengths that are not so",
     [](size_t size) { return kHeader1_5 + Little(1, 4) + Little(size / 8 * 2, 4) + std::string(size, '\x7F'); }},
    {"empty groups", [](size_t size) { return kHeader1_5 + Little(size / 6, 4) + std::string(size / 6 * 6, '\0'); }},
    {"empty entries", [](size_t size) { return Binary(size, true, 0, 0, kNothing); }},
    {"empty entries, 1.0", [](size_t size) { return Binary(size, true, 0, 0, kNothing, Image1_0); }},
    {"empty entries, code page", [](size_t size) { return Binary(size, true, 2, 0, kNothing); }},
    {"groups of one empty entry", [](size_t size) { return Binary(size, false, 0, 0, kNothing); }},
    {"groups of one empty entry, UTF-8", [](size_t size) { return Binary(size, false, 1, 0, kNothing); }},
    {"groups of no bucket", [](size_t size) { return Binary(size, false, 0, 1021, kSameKey); }},
    {"groups of the wrong bucket", [](size_t size) { return Binary(size, false, 0, 0, kSameKey); }},
    {"an entry many times", [](size_t size) { return Binary(size, true, 0, 580, kSameKey); }},
    {"keys of one bucket, each a group", [](size_t size) { return Binary(size, false, 0, kCrowd, kCrowdingKeys); }},
    {"malformed values", [](size_t size) { return Binary(size, true, 1, 580, [](size_t) { return std::pair("/a"s, "\xE2\x82\xE2"s); }); }},
    {"one malformed value",
     [](size_t size) { return Binary(1, true, 1, 580, [&](size_t) { return std::pair("/a"s, std::string(size, '\xFF')); }); }},
    {"one key", [](size_t size) { return Binary(1, true, 0, 0, [&](size_t) { return std::pair(std::string(size, '\xFF'), ""s); }); }},
    {"records of the same entries", RecordsOfTheSameEntries},
    {"many texts", [](size_t size) { return Filled("", size, "\"$$$/a=b\"\n\n\n\n\n\n\n\n\n\n\n\n\n\n"); }, 23},
    {"many images", [](size_t size) { return Filled("", size, kSmallImage); }, kSmallImage.size()},
};

// Of the processor, which other processes leave alone; on Windows, whose clock() is too coarse, of the clock.
double SecondsSoFar() {
  if (!IS_WINDOWS) return static_cast<double>(std::clock()) / CLOCKS_PER_SEC;
  return std::chrono::duration<double>(std::chrono::steady_clock::now().time_since_epoch()).count();
}

struct Cost {
  double imageSize = 0, total = 0, peak = 0, seconds = 0;
};

// Of loading, of looking at every entry, and of letting go.
Cost CostOf(const Shape& shape, size_t size, int rounds) {
  const std::string image = shape.make(size);
  const size_t step = shape.imageSize != 0 ? shape.imageSize : image.size();
  Cost cost{.imageSize = static_cast<double>(image.size()), .seconds = 1e9};
  for (int round = 0; round < rounds; ++round) {
    const AllocationMeter meter;
    const double start = SecondsSoFar();
    {
      DictionaryTable table;
      for (size_t at = 0; at + step <= image.size(); at += step) {
        boost::interprocess::ibufferstream stream(image.data() + at, step);
        table.Load(stream);
      }
      table.LastLoad();
      while (table.Detach(Key("/a")) != nullptr) {
      }
    }
    cost.seconds = std::min(cost.seconds, SecondsSoFar() - start);
    cost.total = static_cast<double>(meter.TotalBytes());
    cost.peak = static_cast<double>(meter.PeakBytes());
  }
  return cost;
}

// What takes time quadratic in the image takes 64 times as long for each byte of the larger one:
// that leaves room for caches and for a busy machine.
TEST(Bounds, CostGrowsWithTheImage) {
  constexpr double kGrowth = 64, kPeak = 100, kTotal = 130, kFixed = 20'000;
  for (const Shape& shape : kShapes) {
    SCOPED_TRACE(shape.name);
    const Cost small = CostOf(shape, 8'000, 8);
    const Cost large = CostOf(shape, static_cast<size_t>(8'000 * kGrowth), 2);
    for (const Cost& cost : {small, large}) {
      EXPECT_LT(cost.peak, kFixed + kPeak * cost.imageSize);
      EXPECT_LT(cost.total, kFixed + kTotal * cost.imageSize);
    }
    EXPECT_LT(large.seconds, kGrowth * 20 * (small.seconds + 2e-5));
  }
}

// A stream of any size that takes no memory: what it begins with, and then one byte over and over
// again.
class EndlessBuffer : public std::streambuf {
 public:
  EndlessBuffer(std::string beginning, char filler, uint64_t claimedSize)
      : first(std::move(beginning)), size(claimedSize), rest(4096, filler) {}

 protected:
  int_type underflow() override {
    if (position >= size) return traits_type::eof();
    const bool isFirst = position < first.size();
    std::string& block = isFirst ? first : rest;
    char* const next = block.data() + (isFirst ? position : 0);
    const uint64_t count = std::min<uint64_t>(static_cast<uint64_t>(block.data() + block.size() - next), size - position);
    setg(next, next, next + count);
    position += count;
    return traits_type::to_int_type(*next);
  }

  pos_type seekoff(off_type offset, std::ios::seekdir from, std::ios::openmode) override {
    const auto held = static_cast<uint64_t>(egptr() - gptr());
    if (from == std::ios::cur && offset == 0) return static_cast<off_type>(position - held);
    position = static_cast<uint64_t>(from == std::ios::end ? static_cast<off_type>(size) + offset : offset);
    setg(nullptr, nullptr, nullptr);
    return static_cast<off_type>(position);
  }
  pos_type seekpos(pos_type to, std::ios::openmode which) override { return seekoff(off_type(to), std::ios::beg, which); }

 private:
  std::string first;
  uint64_t size;
  std::string rest;
  uint64_t position = 0;
};

constexpr size_t kMostAtOnce = 16 << 20;  // what a process has that has little left

// Images around 2^31 and 2^32 bytes, and beyond: they end as short or in std::bad_alloc, and what
// was loaded before stays.
TEST(Bounds, SizesBeyond31And32BitsAreRefused) {
  const std::string line = "\"$$$/a=some text here\"\n";
  const std::string one = kHeader1_5 + Little(1, 4), bucket = Little(580, 2);
  const std::string oldOne = kHeader1_0 + Little(2, 2) + bucket + Little(36, 4) + Little(0, 2) + Little(0xFFFFFFFF, 4);
  const auto failed = LoadDamage::kInterrupted, isShort = LoadDamage::kShortRead;
  struct {
    std::string beginning;
    char filler;
    LoadDamage damage;    // of an image of more than 32 GiB
    uint64_t neededSize;  // without which it is a short read
  } const cases[] = {
      {line, 'x', failed, 0},
      {LittleEndianImage(u"\"$$$/a=some text here\"\n\"$$$/b="), 'x', failed, 0},
      {BigEndianImage(u"\"$$$/a=some text here\"\n"), '^', failed, 0},
      {kHeader1_5 + Little(0x1FFFFFFF, 4), '\0', failed, 0x7FFFFFFC},
      {kHeader1_5 + Little(0x20000000, 4), '\0', failed, 0x80000000},
      {kHeader1_5 + Little(0xFFFFFFFF, 4), '\0', failed, 0x3FFFFFFFC},
      {one + Little(0x1FFFFFFE, 4), '\0', failed, 0x7FFFFFF8},
      {one + Little(0x3FFFFFFE, 4), '\0', failed, 0xFFFFFFF8},
      {one + Little(0x40000000, 4), '\0', failed, 0x100000000},
      {one + Little(0xFFFFFFFE, 4), '\0', failed, 0x3FFFFFFF8},
      {one + Little(2, 4) + Little(2, 4) + Little(0x7FFFFFFF, 4) + bucket + "/a", '\0', failed, 0},
      {one + Little(2, 4) + Little(0xFFFFFFFF, 4) + Little(0xFFFFFFFF, 4) + bucket, '\0', failed, 0},
      {oldOne, '\xFF', failed, 0},
  };
  for (const auto& each : cases) {
    for (const uint64_t size : {uint64_t{0x7FFFFFFE}, uint64_t{0x7FFFFFFF}, uint64_t{1} << 31, uint64_t{0xFFFFFFFF},
                                (uint64_t{1} << 32) + 100, uint64_t{1} << 35}) {
      SCOPED_TRACE(testing::Message() << &each - cases << " of " << size);
      EndlessBuffer buffer(each.beginning, each.filler, size);
      std::istream stream(&buffer);
      DictionaryTable table;
      Load(table, line);
      bool threw = false;
      {
        const AllocationMeter meter(0, kMostAtOnce);
        try {
          table.Load(stream);
        } catch (const std::bad_alloc&) {
          threw = true;
        }
        EXPECT_LT(meter.PeakBytes(), 4 * ptrdiff_t{kMostAtOnce});
      }
      const bool isWhole = size - std::min<uint64_t>(size, each.beginning.size()) >= each.neededSize;
      EXPECT_EQ(table.LastLoad().damage, isWhole ? each.damage : isShort);
      EXPECT_EQ(threw, table.LastLoad().damage == failed);
      EXPECT_EQ(Translated(table, "$$$/a=none"), u"some text here");
    }
  }
}

// Every pair of lengths of which one or the sum is beyond 31 or 32 bits, in an image that is small.
TEST(Bounds, LengthsBeyond31And32BitsAreShortReads) {
  constexpr uint32_t kLengths[] = {0,          2,          0x3FFFFFFF, 0x7FFFFFF7, 0x7FFFFFFE, 0x7FFFFFFF,
                                   0x80000000, 0xFFFFFFF7, 0xFFFFFFFB, 0xFFFFFFFC, 0xFFFFFFFE, 0xFFFFFFFF};
  const std::vector<ImageGroup> groups = {{580, {{"/a", "x."}, {"/b", "x."}}}};
  for (const uint32_t keyLength : kLengths) {
    for (const uint32_t valueLength : kLengths) {
      if (keyLength <= 2 && valueLength <= 2) continue;
      for (const int encoding : {0, 1, 2}) {
        const std::string key = Little(keyLength, 4), value = Little(valueLength, 4);
        const std::string images[] = {Image1_5(encoding, groups).replace(40, 8, key + value),
                                      Image1_0(encoding, groups).replace(50, 10, key + "/b" + value)};
        for (const std::string& image : images) {
          DictionaryTable table;
          const AllocationMeter meter;
          Load(table, image);
          ASSERT_EQ(table.LastLoad().damage, LoadDamage::kShortRead) << keyLength << ' ' << valueLength;
          ASSERT_EQ(table.LastLoad().entriesAdded, 1u);
          ASSERT_LT(meter.TotalBytes(), 20'000u);
        }
      }
    }
  }
}

// What is refused for its size alone must not be looked at: there is one byte behind each pointer.
TEST(Bounds, TextsBeyond31And32BitsAreRefusedUnread) {
  constexpr size_t kMost32 = 0xFFFFFFFF;
  const uint8_t byte = 0;
  const uint16_t unit = 0;
  EntryMemory memory;
  const AllocationMeter meter(0, kMostAtOnce);
  for (const size_t size : {size_t{0x7FFFFFFF}, size_t{0x80000000}, kMost32 - 48, kMost32 - 20, kMost32 - 1, kMost32}) {
    for (const size_t other : {size_t{0}, size_t{0x7FFFFFFE}, kMost32 - 40, kMost32}) {
      EXPECT_THROW(KeyedRun::Create(memory.runs, {&byte, size}, {&byte, other}), std::bad_alloc);
      EXPECT_THROW(KeyedRun::Create(memory.runs, {&byte, other}, {&byte, size}), std::bad_alloc);
    }
    EXPECT_THROW(KolvaneString(&byte, static_cast<uint32_t>(size)), std::bad_alloc);
    EXPECT_THROW(KolvaneString(&unit, static_cast<uint32_t>(size)), std::bad_alloc);
    EXPECT_THROW(ToKeyBytes({&unit, std::min(size, std::numeric_limits<size_t>::max() / 4)}), std::bad_alloc);
    if (size == 0x7FFFFFFF) continue;
    EXPECT_THROW(CountUnicode("x", size), OVErrException);
    EXPECT_THROW(CountMultiByte(&unit, size), OVErrException);
    UnicodeBuffer buffer;
    buffer.Append(1);
    EXPECT_THROW(buffer.Reserve(size), std::bad_alloc);
    EXPECT_THROW(buffer.Extend(size), std::bad_alloc);
    EXPECT_THROW(buffer.Extend(std::numeric_limits<size_t>::max()), std::bad_alloc);  // where the sum is 0
    EXPECT_EQ(buffer.Length(), 1u);
  }
}

}  // namespace
