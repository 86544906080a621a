// Watches, and fails, what the code under test allocates with operator new.
#pragma once

#include <cstddef>

// Where something is to fail: the nth time (from 1), or never (0).
struct Fault {
  size_t at = 0;
  bool lasts = false;  // and each time after that
  size_t times = 0;    // so far
  bool hasFired = false;

  // Whether this time is one to fail.
  bool Strikes() {
    hasFired |= ++times == at;
    return times == at || (lasts && hasFired);
  }
};

// Counts from its construction on; one at a time.
class AllocationMeter {
 public:
  explicit AllocationMeter(size_t failAt = 0) : AllocationMeter(own) { own.at = failAt; }
  explicit AllocationMeter(Fault& fault);
  ~AllocationMeter();
  AllocationMeter(const AllocationMeter&) = delete;
  AllocationMeter& operator=(const AllocationMeter&) = delete;

  size_t TotalBytes() const;
  ptrdiff_t LiveBlocks() const;  // those freed that were allocated before count less than nothing
  bool Failed() const;

  // Since the program began, with a meter or without.
  static ptrdiff_t LiveBlocksInAll();

 private:
  Fault own;
};
