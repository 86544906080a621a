// UTF-16 code units: byte-order marks, byte order and surrogates.
#pragma once

#include <cstdint>
#include <string_view>

namespace platform {

inline constexpr uint16_t kByteOrderMark = 0xFEFF;
inline constexpr uint16_t kReplacementCharacter = 0xFFFD;

// The byte-order mark as encoded at the start of a text.
inline constexpr std::string_view kBOMUTF8 = "\xEF\xBB\xBF";
inline constexpr std::string_view kBOMUTF16LE = "\xFF\xFE";
inline constexpr std::string_view kBOMUTF16BE = "\xFE\xFF";

constexpr uint16_t SwapBytes(uint16_t unit) noexcept {
  return static_cast<uint16_t>(unit << 8 | unit >> 8);
}

constexpr bool IsHighSurrogate(uint16_t unit) noexcept {
  return (unit & 0xFC00) == 0xD800;
}

constexpr bool IsLowSurrogate(uint16_t unit) noexcept {
  return (unit & 0xFC00) == 0xDC00;
}

constexpr bool IsSurrogate(uint16_t unit) noexcept {
  return (unit & 0xF800) == 0xD800;
}

}  // namespace platform
