// The conversion against what Windows makes of the same texts. scripts/conversion-results writes that
// down anew.
#include <gtest/gtest.h>

#include <fstream>

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

}  // namespace
