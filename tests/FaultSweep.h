// A fault at each point where the code under test can fail, one after the other.
#pragma once

#include <gtest/gtest.h>

#include <string>

#include "tests/AllocationMeter.h"

// Runs `round` for the 1st, the 2nd, ... point until there is none any more: with a fault at that point
// alone, then with faults from there on. A round hands its fault to what is to fail, an
// AllocationMeter or a CallTrace. Each mode is to meet so many faults at least. A round may leave
// memory behind, but not each time.
template <class Round>
void SweepFaults(size_t least, const Round& round) {
  for (const bool lasts : {false, true}) {
    size_t at = 0;
    for (bool hasFired = true; hasFired;) {
      SCOPED_TRACE("fault " + std::to_string(++at) + (lasts ? " and all after it" : ""));
      ptrdiff_t left = 1;
      for (int i = 0; i < 3 && left != 0; ++i) {
        Fault fault{at, lasts};
        const ptrdiff_t before = AllocationMeter::LiveBlocksInAll();
        round(fault);
        left = AllocationMeter::LiveBlocksInAll() - before;
        hasFired = fault.hasFired;
      }
      if (testing::Test::HasFailure()) return;
      EXPECT_EQ(left, 0) << "blocks, once more";
    }
    EXPECT_GT(at, least) << "faults" << (lasts ? " that last" : "");
  }
}
