// Watches, and fails, what the code under test allocates with operator new.
#pragma once

#include <cstddef>

// Counts from its construction on; one at a time.
class AllocationMeter {
 public:
  // With failAt = n, the nth allocation fails (from 1); 0 lets all succeed.
  explicit AllocationMeter(size_t failAt = 0);
  ~AllocationMeter();
  AllocationMeter(const AllocationMeter&) = delete;
  AllocationMeter& operator=(const AllocationMeter&) = delete;

  size_t TotalBytes() const;
  ptrdiff_t LiveBlocks() const;  // those freed that were allocated before count less than nothing
  bool Failed() const;
};
