// The conversion against what Windows makes of the same texts. scripts/conversion-results writes that
// down anew.
#include <gtest/gtest.h>

#include <fstream>

#include "ConversionResults.h"

namespace {

// What is the same on all systems.
std::vector<std::string> Compared(const std::vector<std::string>& lines) {
  std::vector<std::string> compared;
  for (const std::string& line : lines) {
    if (IS_WINDOWS || !line.starts_with("look-alike")) compared.push_back(line);
  }
  return compared;
}

TEST(Conversion, DoesWhatWindowsDoes) {
  std::ifstream file(CONVERSION_RESULTS);
  std::vector<std::string> expected;
  for (std::string line; std::getline(file, line);) expected.push_back(line);
  ASSERT_GT(expected.size(), 1000u);
  const std::vector<std::string> actual = Compared(ConversionResults()), compared = Compared(expected);
  ASSERT_EQ(actual.size(), compared.size());
  for (size_t i = 0; i < actual.size(); ++i) EXPECT_EQ(actual[i], compared[i]);
}

}  // namespace
