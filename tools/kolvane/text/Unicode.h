// UTF-8, which the command speaks, and UTF-16, which dictionaries speak.
#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "kolvane/lib/LoadStatus.h"

// Damaged text is replaced as translations replace it. Throws OVErrException where the text or the
// result has more than 2^31 - 1 bytes or units.
std::string ToUTF8(std::span<const uint16_t> units);
std::vector<uint16_t> ToUTF16(std::string_view text);

// The same in the code page that a selector names (Converters.h).
std::string ToMultiByte(std::span<const uint16_t> units, const int* selector);
std::vector<uint16_t> FromMultiByte(std::string_view text, const int* selector);

std::string_view AsText(std::span<const uint8_t> bytes) noexcept;

// The units that are stored in little-endian order; an odd last byte belongs to none.
std::vector<uint16_t> UnitsOf(std::span<const uint8_t> bytes);

// The units of UTF-16 in either byte order.
std::vector<uint16_t> DecodedUTF16(std::string_view text, bool isBigEndian);

// The byte-order mark that begins text in UTF-16; empty for other encodings.
std::string_view UTF16Mark(TextEncoding encoding) noexcept;

// A key, which is bytes, to be shown: as it is where it is UTF-8, else with a character for each
// byte.
std::string KeyText(std::string_view key);

// The code point that begins at a unit of the text; an unpaired surrogate is one of its own.
char32_t CodePointAt(std::span<const uint16_t> units, size_t at) noexcept;

// Whether it is one half of a pair, without the other.
bool IsSurrogate(char32_t codePoint) noexcept;

// The units that a code point takes.
size_t UnitCount(char32_t codePoint) noexcept;

// Ends a line of UTF-16, alone or as a part of CR LF.
bool IsLineEnd(char32_t codePoint) noexcept;

// Pairs of surrogates count once.
size_t CodePointCount(std::span<const uint16_t> units) noexcept;

// "U+0142"
std::string CodePointText(char32_t codePoint);
