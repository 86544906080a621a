// Watches, and fails, what the code under test allocates: with operator new everywhere, and where a
// test's binary wraps it (tests/CMakeLists.txt) also the memory that comes from the system itself.
#pragma once

#include <cstddef>
#include <limits>

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
  static constexpr size_t kAnySize = std::numeric_limits<size_t>::max();

  // Allocations of more than `most` bytes fail, too.
  explicit AllocationMeter(size_t failAt = 0, size_t most = kAnySize) : AllocationMeter(own, most) { own.at = failAt; }
  explicit AllocationMeter(Fault& fault, size_t most = kAnySize);
  ~AllocationMeter();
  AllocationMeter(const AllocationMeter&) = delete;
  AllocationMeter& operator=(const AllocationMeter&) = delete;

  bool Failed() const;
  size_t TotalBytes() const;

  // What is freed that was allocated before counts less than nothing.
  ptrdiff_t LiveBlocks() const;
  ptrdiff_t LiveBytes() const;

  ptrdiff_t PeakBytes() const;  // the most bytes that lived at a time

  // Since the program began, with a meter or without.
  static ptrdiff_t LiveBlocksInAll();

 private:
  Fault own;
};
