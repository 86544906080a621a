// All little-endian integer encoding in this library.
#pragma once

#include <bit>
#include <cstdint>

namespace tovali_private {

// Stored text and dictionary files are little-endian, and code units are used in place.
static_assert(std::endian::native == std::endian::little);

inline uint16_t Read16(const uint8_t* bytes) noexcept {
  return static_cast<uint16_t>(bytes[0] | bytes[1] << 8);
}

inline uint32_t Read32(const uint8_t* bytes) noexcept {
  return Read16(bytes) | static_cast<uint32_t>(Read16(bytes + 2)) << 16;
}

inline void Write16(uint8_t* bytes, uint16_t value) noexcept {
  bytes[0] = static_cast<uint8_t>(value);
  bytes[1] = static_cast<uint8_t>(value >> 8);
}

inline void Write32(uint8_t* bytes, uint32_t value) noexcept {
  for (int i = 0; i < 4; ++i) bytes[i] = static_cast<uint8_t>(value >> (8 * i));
}

}  // namespace tovali_private
