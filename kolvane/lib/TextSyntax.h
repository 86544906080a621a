// The grammar of text dictionaries: splitting a line into key and value, and decoding a value.
//
//   anything "$$$/Key=Value" anything
//
// The results borrow their input unless they are values. Nothing here keeps state.
#pragma once

#include <boost/container/small_vector.hpp>
#include <cstdint>
#include <optional>
#include <span>
#include <vector>

#include "kolvane/lib/KolvaneString.h"
#include "kolvane/lib/Scan.h"

namespace tovali_private {

// Returns the part of a line between the first two double quotes that no backslash immediately
// precedes. Without a second quote it extends to the end of the line; without a first one it is the
// whole line.
std::span<const uint16_t> QuotedPart(std::span<const uint16_t> line) noexcept;

template <class Unit>
struct SplitText {
  std::span<const Unit> key;
  std::span<const Unit> value;
};

// Splits `$$$/Key=Value` at its first `=`; without one, the whole text is the key and the value is
// empty. The `$$$` is optional and belongs to neither part. Returns nothing for a text that begins
// with one or two dollar signs.
template <class Unit>
std::optional<SplitText<Unit>> SplitKolvane(std::span<const Unit> text) noexcept;

extern template std::optional<SplitText<char>> SplitKolvane(std::span<const char>) noexcept;
extern template std::optional<SplitText<uint16_t>> SplitKolvane(std::span<const uint16_t>) noexcept;

// The line ends of UTF-16 text beside line feed and carriage return.
inline constexpr uint16_t kLineSeparatorUnit = 0x2028;
inline constexpr uint16_t kParagraphSeparatorUnit = 0x2029;

// The first units of what Unescape decodes.
using EscapeStarts = DelimiterSet<'^', '\\', '#'>;

// Returns a key's bytes, the low 8 bits of each unit.
using KeyBytes = boost::container::small_vector<uint8_t, 256>;
KeyBytes ToKeyBytes(std::span<const uint16_t> key);

// One step of the escapes pass of Unescape.
struct EscapeToken {
  enum Kind : uint8_t { kPlain, kEscape, kUnknownEscape, kUnfinishedEscape };

  Kind kind = kPlain;
  uint8_t taken = 1;  // the number of units consumed, then the units that they decode to
  uint8_t count = 1;
  uint16_t units[2] = {};
};

// Decodes the start of a text. An unknown escape, and one at the end of the text, decodes to
// itself. Requires: the text is not empty.
EscapeToken DecodeNext(std::span<const uint16_t> text) noexcept;

// Decodes caret and backslash escapes, then named characters such as `#{nbsp}`. Unknown ones stay
// unchanged. The result is never longer than the text. The second form returns the text itself if
// there is nothing to decode, else a view of `decoded`.
KolvaneString Unescape(std::span<const uint16_t> text);
std::span<const uint16_t> Unescape(std::span<const uint16_t> text, std::vector<uint16_t>& decoded);

// Replaces line ends and double quotes by backslash escapes. Returns nothing if there are none.
// Unescape is not its inverse: it also decodes escapes and named characters of the text itself.
std::optional<std::vector<uint16_t>> EscapeForText(std::span<const uint16_t> text);

// Why a key and value cannot be written as text.
enum class UnwritableReason : uint8_t {
  kNone,
  kKey,            // the key has a zero, a line end, an equals sign, or a quote without a backslash
  kZeroCharacter,  // the value has a zero,
  kLineSeparator,  // or U+2028 or U+2029,
  kNamedCharacter  // or the written form of a named character: `#{amp}`
};

// Appends a line, without terminator, from which StoreLine stores exactly this key and value.
// Writes invisible characters by name if they have one. If the value ends in a backslash, the line
// has no closing quote, which would be read as escaped. Appends nothing if the result is not kNone.
UnwritableReason AppendLine(std::span<const uint8_t> key, std::span<const uint16_t> value,
                            std::vector<uint16_t>& line);

}  // namespace tovali_private
