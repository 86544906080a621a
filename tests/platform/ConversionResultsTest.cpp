// The conversion against what Windows makes of the same texts. scripts/conversion-results writes that
// down anew.
#include <gtest/gtest.h>

#include <fstream>

#include "platform/CodePage.h"
#include "tests/platform/ConversionResults.h"

namespace {

bool IsOfWindowsAlone(const std::string& line) {
  return line.starts_with("truncated") || line.starts_with("look-alike");
}

TEST(Conversion, DoesWhatWindowsDoes) {
  std::ifstream file(CONVERSION_RESULTS);
  std::vector<std::string> expected, actual = ConversionResults();
  for (std::string line; std::getline(file, line);) expected.push_back(line);
  if (!IS_WINDOWS) {
    std::erase_if(expected, IsOfWindowsAlone);
    std::erase_if(actual, IsOfWindowsAlone);
  }
  ASSERT_GT(expected.size(), 1000u);
  ASSERT_EQ(actual.size(), expected.size());
  for (size_t i = 0; i < actual.size(); ++i) EXPECT_EQ(actual[i], expected[i]);
}

// What each "truncated" line of Windows loses stays: a lead byte at the end of the text with too few bytes.
TEST(Conversion, KeepsWhatFollowsATruncatedSequence) {
  if (IS_WINDOWS) return;
  const struct {
    std::string tail;
    std::u16string decoded;
  } cases[] = {
      {"\xE9t", u"\uFFFDt"},
      {"\xC3", u"\uFFFD"},
      {"\xE2\x82", u"\uFFFD"},
      {"\xE2\x41", u"\uFFFDA"},
      {"\xE2\xC3", u"\uFFFD\uFFFD"},
      {"\xE0\x80", u"\uFFFD"},
      {"\xED\xA0", u"\uFFFD"},
      {"\xF0\x9F", u"\uFFFD"},
      {"\xF0\x9F\x98", u"\uFFFD"},
      {"\xF0\x9F\x41", u"\uFFFDA"},
      {"\xF0\xC3\xA9", u"\uFFFD\u00E9"},
      {"\xF0xy", u"\uFFFDxy"},
      {"\xF0\x80\x80", u"\uFFFD\uFFFD"},
      {"\xF4\x90", u"\uFFFD"},
      {"\xF4\x90\x41", u"\uFFFDA"},
      {"\xF4\x8F\xBF", u"\uFFFD"},
  };
  for (const auto& each : cases) {
    for (const std::string before : {"", "a", "aaaaaaaa"}) {
      SCOPED_TRACE(testing::Message() << &each - cases << " after " << before);
      const std::string text = before + each.tail;
      const auto size = static_cast<int>(text.size());
      uint16_t units[16];
      const int count = platform::MultiByteToWideChar(platform::kCodePageUTF8, 0, text.data(), size, units, 16);
      EXPECT_EQ(std::u16string(units, units + count), std::u16string(before.begin(), before.end()) + each.decoded);
    }
  }
}

// Windows knows more code pages, and flags.
TEST(Conversion, RefusesWhatBreaksItsRules) {
  if (IS_WINDOWS) return;
  uint16_t units[4];
  constexpr uint32_t utf8 = platform::kCodePageUTF8;
  struct {
    uint32_t codePage, flags;
    const char* text;
    int count;
    uint16_t* out;
    int capacity;
  } const cases[] = {
      {1252, 0, "a", 1, units, 4},  {utf8, 8, "a", 1, units, 4},   {utf8, 0, nullptr, 1, units, 4}, {utf8, 0, "a", 0, units, 4},
      {utf8, 0, "a", -1, units, 4}, {utf8, 0, "a", 1, nullptr, 4}, {utf8, 0, "a", 1, units, -1},
  };
  for (const auto& each : cases) {
    EXPECT_EQ(0, platform::MultiByteToWideChar(each.codePage, each.flags, each.text, each.count, each.out, each.capacity));
    EXPECT_EQ(platform::GetLastError(), platform::kErrorInvalidParameter) << &each - cases;
  }
}

}  // namespace
