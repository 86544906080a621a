// SIMD search for the first of a few delimiters.
#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>
#include <span>

#ifdef __SSE2__
#include <emmintrin.h>
#endif

namespace tovali_private {

#ifdef __SSE2__

inline __m128i EqualUnits(__m128i block, uint16_t unit) noexcept {
  return _mm_cmpeq_epi16(block, _mm_set1_epi16(static_cast<int16_t>(unit)));
}

inline __m128i EqualUnits(__m128i block, uint8_t unit) noexcept {
  return _mm_cmpeq_epi8(block, _mm_set1_epi8(static_cast<char>(unit)));
}

// DelimiterSet::FindFirst for the whole blocks of 16 bytes, each compared with all delimiters at
// once. Returns the end of the blocks if they have none.
template <auto... kUnits, class Unit>
size_t FindFirstInBlocks(std::span<const Unit> text) noexcept {
  constexpr size_t kBlock = 16 / sizeof(Unit);
  size_t at = 0;
  for (; text.size() - at >= kBlock; at += kBlock) {
    const __m128i block = _mm_loadu_si128(reinterpret_cast<const __m128i*>(text.data() + at));
    __m128i found = _mm_setzero_si128();
    ((found = _mm_or_si128(found, EqualUnits(block, Unit{kUnits}))), ...);
    const auto bytes = static_cast<uint32_t>(_mm_movemask_epi8(found));
    if (bytes != 0) return at + static_cast<size_t>(std::countr_zero(bytes)) / sizeof(Unit);
  }
  return at;
}

#else

template <auto... kUnits, class Unit>
size_t FindFirstInBlocks(std::span<const Unit>) noexcept {
  return 0;
}

#endif

// A compile-time set of delimiters.
template <auto... kUnits>
struct DelimiterSet {
  template <class Unit>
  static constexpr bool Has(Unit unit) noexcept {
    return ((unit == kUnits) || ...);
  }

  // Returns the index of the first delimiter, or the text's length.
  template <class Unit>
  static size_t FindFirst(std::span<const Unit> text) noexcept {
    size_t at = FindFirstInBlocks<kUnits...>(text);
    while (at < text.size() && !Has(text[at])) ++at;
    return at;
  }
};

}  // namespace tovali_private
