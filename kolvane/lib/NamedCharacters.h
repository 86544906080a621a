// The characters that dictionaries write by name, such as `#{nbsp}`.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

namespace tovali_private {

struct NamedCharacter {
  std::string_view name;
  uint16_t character[2];  // the second unit is 0, except in `endl`

  std::span<const uint16_t> Units() const noexcept {
    return {character, character[1] == 0 ? size_t{1} : size_t{2}};
  }

  // The length of `#{name}` in units.
  size_t WrittenLength() const noexcept { return name.size() + 3; }
};

// All named characters: four controls, the Latin-1 entities of HTML 4 by code point, then its
// special entities. No name is a prefix of another.
std::span<const NamedCharacter> NamedCharacters() noexcept;

// Returns the character whose `#{name}` the text begins with, or null. Names are case-sensitive.
const NamedCharacter* MatchNamedCharacter(std::span<const uint16_t> text) noexcept;

}  // namespace tovali_private
