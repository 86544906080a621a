// The conversion against what Windows makes of the same texts. scripts/conversion-results writes that
// down anew.
#include <gtest/gtest.h>

#include <fstream>

#include "CodePage.h"
#include "ConversionResults.h"

namespace {

TEST(Conversion, DoesWhatWindowsDoes) {
  std::ifstream file(CONVERSION_RESULTS);
  std::vector<std::string> expected;
  for (std::string line; std::getline(file, line);) {
    if (IS_WINDOWS || !line.starts_with("look-alike")) expected.push_back(line);  // there are none elsewhere
  }
  ASSERT_GT(expected.size(), 1000u);
  const std::vector<std::string> actual = ConversionResults();
  ASSERT_EQ(actual.size(), expected.size());
  for (size_t i = 0; i < actual.size(); ++i) EXPECT_EQ(actual[i], expected[i]);
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
