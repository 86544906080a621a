// Looking through text for what ends a part of it.
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

// Like UnitSet's RunBefore, for as many whole blocks of 16 bytes as there are.
template <auto... kUnits, class Unit>
size_t RunOfBlocksBefore(std::span<const Unit> text) noexcept {
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
size_t RunOfBlocksBefore(std::span<const Unit>) noexcept {
  return 0;
}

#endif

// A few units that are looked for together.
template <auto... kUnits>
struct UnitSet {
  template <class Unit>
  static constexpr bool Has(Unit unit) noexcept {
    return ((unit == kUnits) || ...);
  }

  // The length of the part before the first of them, or of the whole text.
  template <class Unit>
  static size_t RunBefore(std::span<const Unit> text) noexcept {
    size_t at = RunOfBlocksBefore<kUnits...>(text);
    while (at < text.size() && !Has(text[at])) ++at;
    return at;
  }
};

}  // namespace tovali_private
