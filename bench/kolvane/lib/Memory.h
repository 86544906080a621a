// How much memory the process takes.
#pragma once

#include <cstddef>

// Gives what was freed back to the system: what is allocated next is fresh.
void TrimMemory();

// The peak since its construction, on top of what there was then. One at a time.
class PeakMeter {
 public:
  PeakMeter();
  double PeakBytes() const;

 private:
  double before;
};
