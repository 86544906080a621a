// Looking through text for what ends a part of it.
#pragma once

#include <cstddef>
#include <span>

namespace tovali_private {

// The length of the part before the first unit for which `ends` holds. Blocks are looked at whole,
// which compilers turn into vector instructions.
template <class Unit, class Predicate>
size_t RunBefore(std::span<const Unit> text, Predicate ends) noexcept {
  constexpr size_t kBlock = 16 / sizeof(Unit);
  size_t at = 0;
  for (; text.size() - at >= kBlock; at += kBlock) {
    bool any = false;
    for (size_t i = 0; i < kBlock; ++i) any |= ends(text[at + i]);
    if (any) break;
  }
  while (at < text.size() && !ends(text[at])) ++at;
  return at;
}

}  // namespace tovali_private
