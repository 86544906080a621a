// Accelerators: the `&` of a menu's or a button's text, which makes the character behind it the key
// that chooses it.
//
// `&&` is a plain ampersand, and so is `&` at the end of a text, before white space, a control
// character, a quotation mark or a bracket (but `{`, which may begin a placeholder), and at the
// start of an entity such as `&amp;` or `&#38;`.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <vector>

// Where the `&` of each accelerator stands; a character follows it.
std::vector<size_t> FindAccelerators(std::span<const uint16_t> text);

// The character behind the one `&` that makes an accelerator, folded; nothing where there is none,
// where there are several, or where a placeholder takes the character's place.
std::optional<char32_t> AcceleratorOf(std::span<const uint16_t> text);
