// The grammar of text dictionaries: how a line is taken apart, and how a value is decoded.
//
//   anything "$$$/Key=Value" anything
//
// The functions take code units or bytes and give back parts of them; nothing here keeps state.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <vector>

#include "KolvaneString.h"
#include "Scan.h"

namespace tovali_private {

// The part of a line that holds its definition: what stands between the first two double quotes
// that no backslash immediately precedes. Without a second one it runs to the end of the line;
// without a first one it is the whole line.
std::span<const uint16_t> EntryText(std::span<const uint16_t> line) noexcept;

template <class Unit>
struct SplitText {
  std::span<const Unit> key;
  std::span<const Unit> value;
};

// Takes `$$$/Key=Value` apart at its first `=`, without which the whole is key and the value empty.
// The `$$$` belongs to neither part and may be missing; nothing is returned for a text that begins
// with fewer than three dollar signs but at least one.
template <class Unit>
std::optional<SplitText<Unit>> SplitKolvane(std::span<const Unit> text) noexcept;

extern template std::optional<SplitText<char>> SplitKolvane(std::span<const char>) noexcept;
extern template std::optional<SplitText<uint16_t>> SplitKolvane(std::span<const uint16_t>) noexcept;

// What can begin something that Unescape decodes.
using EscapeStarts = UnitSet<'^', '\\', '#'>;

// Decodes caret and backslash escapes, then named characters such as `#{nbsp}`; what it does not
// know stays as it is. The result is never longer than the text. The second form gives the text
// back where there is nothing to decode, and otherwise stores in `decoded` what it gives.
KolvaneString Unescape(std::span<const uint16_t> text);
std::span<const uint16_t> Unescape(std::span<const uint16_t> text, std::vector<uint16_t>& decoded);

// Writes line ends and double quotes as backslash escapes; nothing is returned when the text has
// none of them. Unescape undoes these escapes, but it also decodes what the text itself held of
// escapes and named characters.
std::optional<std::vector<uint16_t>> EscapeForText(std::span<const uint16_t> text);

}  // namespace tovali_private
