// The decisions of a walk that goes wherever its input says, or anywhere.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <random>

// Takes decisions from bytes that its maker keeps, or at random without an end.
class Choices {
 public:
  Choices(const uint8_t* data, size_t size) : next(data), end(data + size) {}
  explicit Choices(uint32_t seed) : random(seed), isEndless(true) {}
  Choices(const Choices&) = delete;
  Choices& operator=(const Choices&) = delete;

  // Whether all further decisions will be 0.
  bool AtEnd() const { return next == end && !isEndless; }

  // A number below `count`, which is at most 65536.
  uint32_t Below(uint32_t count) {
    const uint32_t low = Byte();
    return (count > 256 ? low | static_cast<uint32_t>(Byte()) << 8 : low) % count;
  }
  bool OneIn(uint32_t count) { return Below(count) == 0; }

 private:
  uint8_t Byte() {
    if (next == end && isEndless) Refill();
    return next != end ? *next++ : uint8_t{0};
  }
  void Refill() {
    for (uint8_t& byte : block) byte = static_cast<uint8_t>(random() >> 24);
    next = block.data();
    end = next + block.size();
  }

  const uint8_t* next = nullptr;
  const uint8_t* end = nullptr;
  std::mt19937 random;
  bool isEndless = false;
  std::array<uint8_t, 4096> block{};
};
