#include "platform/SeededHash.h"

#define XXH_INLINE_ALL
#include <xxhash.h>

#include <chrono>
#include <exception>
#include <random>

namespace platform {
namespace {

uint64_t RandomSeed() noexcept {
  try {
    std::random_device random;
    return uint64_t{random()} << 32 | random();
  } catch (const std::exception&) {
    const int local = 0;
    const auto time = std::chrono::high_resolution_clock::now().time_since_epoch().count();
    return static_cast<uint64_t>(time) ^ reinterpret_cast<uintptr_t>(&local);
  }
}

}  // namespace

uint64_t ProcessSeed() noexcept {
  static const uint64_t seed = RandomSeed();
  return seed;
}

size_t SeededHash::operator()(std::string_view text) const noexcept {
  return static_cast<size_t>(XXH3_64bits_withSeed(text.data(), text.size(), seed));
}

}  // namespace platform
