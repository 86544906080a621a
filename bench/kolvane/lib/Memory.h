// Memory use of the process.
#pragma once

#include <cstddef>

// Returns freed memory to the system, so that later allocations are fresh.
void TrimMemory();

// Measures the peak since its construction, relative to the use then. One object at a time.
class PeakMeter {
 public:
  PeakMeter();
  double PeakBytes() const;

 private:
  double before;
};
