// What the conversion refuses.
#include <gtest/gtest.h>

#include "CodePage.h"

namespace {

using platform::kCodePageUTF8;

TEST(CodePage, RefusesWhatBreaksItsRules) {
  uint16_t units[4];
  struct {
    uint32_t codePage, flags;
    const char* text;
    int count;
    uint16_t* out;
    int capacity;
  } const cases[] = {
      {1252, 0, "a", 1, units, 4},           {kCodePageUTF8, 8, "a", 1, units, 4},  {kCodePageUTF8, 0, nullptr, 1, units, 4},
      {kCodePageUTF8, 0, "a", 0, units, 4},  {kCodePageUTF8, 0, "a", -1, units, 4}, {kCodePageUTF8, 0, "a", 1, nullptr, 4},
      {kCodePageUTF8, 0, "a", 1, units, -1},
  };
  for (const auto& each : cases) {
    EXPECT_EQ(0, platform::MultiByteToWideChar(each.codePage, each.flags, each.text, each.count, each.out, each.capacity));
    EXPECT_EQ(platform::GetLastError(), platform::kErrorInvalidParameter) << &each - cases;
  }
}

}  // namespace
