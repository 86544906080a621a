// The exception of the dictionary library, which otherwise throws only std::bad_alloc.
#pragma once

#include <cstdint>

// Four ASCII letters, as a big-endian number.
inline constexpr uint32_t kErrorBufferTooSmall = 0x42554646;    // "BUFF"
inline constexpr uint32_t kErrorConversionFailed = 0x6875683f;  // "huh?"

// Carries one of the codes above, or another code of a converter.
class OVErrException {
 public:
  explicit OVErrException(uint32_t errorCode) noexcept : code(errorCode) {}

  uint32_t Code() const noexcept { return code; }

 private:
  uint32_t code;
};
