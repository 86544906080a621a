// Per-process seeded hash for untrusted strings, against hash flooding.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace platform {

// The process's random seed. If the system has no random numbers, it is derived from the time and a
// memory address.
uint64_t ProcessSeed() noexcept;

// A hash function for hash tables.
struct SeededHash {
  using is_avalanching = void;

  size_t operator()(std::string_view text) const noexcept;

  uint64_t seed = ProcessSeed();
};

}  // namespace platform
