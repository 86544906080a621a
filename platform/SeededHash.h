// A hash of texts from outside that differs from process to process. In std::hash, which is the
// same in all of them, texts that collide are easy to make.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace platform {

// Random, and the same from one call to the next. Where the system has no random numbers, it is
// what the time and the place of the process's memory make it.
uint64_t ProcessSeed() noexcept;

// For hash tables, whose maker need not know the seed.
struct SeededHash {
  using is_avalanching = void;

  size_t operator()(std::string_view text) const noexcept;

  uint64_t seed = ProcessSeed();
};

}  // namespace platform
