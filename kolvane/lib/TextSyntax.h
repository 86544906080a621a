// The grammar of text dictionaries: how a line is taken apart, and how a value is decoded.
//
//   anything "$$$/Key=Value" anything
//
// The functions take code units or bytes and give back parts of them; nothing here keeps state.
#pragma once

#include <boost/container/small_vector.hpp>
#include <cstdint>
#include <optional>
#include <span>
#include <vector>

#include "kolvane/lib/KolvaneString.h"
#include "kolvane/lib/Scan.h"

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

// The line ends of UTF-16 text beside line feed and carriage return.
inline constexpr uint16_t kLineSeparatorUnit = 0x2028;
inline constexpr uint16_t kParagraphSeparatorUnit = 0x2029;

// What can begin something that Unescape decodes.
using EscapeStarts = UnitSet<'^', '\\', '#'>;

// Keys are bytes: of each unit the low 8 bits.
using KeyBytes = boost::container::small_vector<uint8_t, 256>;
KeyBytes NarrowKey(std::span<const uint16_t> key);

// What the first pass of Unescape, over the escapes, makes of the start of a text.
struct DecodedStart {
  enum Kind : uint8_t { kPlain, kEscape, kUnknownEscape, kUnfinishedEscape };

  Kind kind = kPlain;
  uint8_t taken = 1;  // units of the text, and what they decode to
  uint8_t count = 1;
  uint16_t units[2] = {};
};

// The text is not empty. An escape that is not known, and one without the unit that it escapes, is
// given back as it is.
DecodedStart DecodeStart(std::span<const uint16_t> text) noexcept;

// Decodes caret and backslash escapes, then named characters such as `#{nbsp}`; what it does not
// know stays as it is. The result is never longer than the text. The second form gives the text
// back where there is nothing to decode, and otherwise stores in `decoded` what it gives.
KolvaneString Unescape(std::span<const uint16_t> text);
std::span<const uint16_t> Unescape(std::span<const uint16_t> text, std::vector<uint16_t>& decoded);

// Writes line ends and double quotes as backslash escapes; nothing is returned when the text has
// none of them. Unescape undoes these escapes, but it also decodes what the text itself held of
// escapes and named characters.
std::optional<std::vector<uint16_t>> EscapeForText(std::span<const uint16_t> text);

// Why no line defines a key with a value.
enum class LineObstacle : uint8_t {
  kNone,
  kKey,            // the key has a zero, a line end, an equals sign, or a quote without a backslash
  kZeroCharacter,  // the value has a zero,
  kLineSeparator,  // or U+2028 or U+2029,
  kNamedCharacter  // or the name of a named character spelt out: `#{amp}`
};

// Appends the line that defines the key, which is bytes, with the value: StoreLine stores exactly
// them. Spaces and the like that cannot be seen are written by name, where they have one. No
// terminator is appended, and nothing at all where there is an obstacle. Where the value
// ends in a backslash, the line has no closing quote: it would be taken for an escaped one.
LineObstacle AppendLine(std::span<const uint8_t> key, std::span<const uint16_t> value,
                        std::vector<uint16_t>& line);

}  // namespace tovali_private
