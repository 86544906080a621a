// The characters that a dictionary may write by name, as `#{nbsp}`.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

namespace tovali_private {

struct NamedCharacter {
  std::string_view name;
  uint16_t character[2];  // the second is 0 but for `endl`, the only name of two units

  std::span<const uint16_t> Units() const noexcept {
    return {character, character[1] == 0 ? size_t{1} : size_t{2}};
  }

  // The units that `#{name}` takes.
  size_t WrittenLength() const noexcept { return name.size() + 3; }
};

// All of them: four controls, then the entity names of HTML 4 for Latin-1 by code point, then its
// special ones. No name is the start of another.
std::span<const NamedCharacter> NamedCharacters() noexcept;

// The character whose `#{name}` stands at the start of the text, or null. Names are case-sensitive.
const NamedCharacter* MatchNamedCharacter(std::span<const uint16_t> text) noexcept;

}  // namespace tovali_private
