// The one exception that the dictionary library throws by itself, beside the allocation failures of
// the standard library.
#pragma once

#include <cstdint>

// Four letters read as a big-endian number.
inline constexpr uint32_t kErrorBufferTooSmall = 0x42554646;    // "BUFF"
inline constexpr uint32_t kErrorConversionFailed = 0x6875683f;  // "huh?"

// Holds an error code: one of the two above, or whatever other code a converter gave.
class OVErrException {
 public:
  explicit OVErrException(uint32_t errorCode) noexcept : code(errorCode) {}

  uint32_t Code() const noexcept { return code; }

 private:
  uint32_t code;
};
