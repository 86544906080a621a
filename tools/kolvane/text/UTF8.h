// Well-formed and malformed UTF-8.
#pragma once

#include <optional>
#include <string_view>
#include <vector>

inline constexpr std::string_view kUTF8Mark = "\xEF\xBB\xBF";

std::string_view WithoutUTF8Mark(std::string_view text) noexcept;

// The offset of the first byte that belongs to no character.
std::optional<size_t> MalformedUTF8At(std::string_view text) noexcept;
bool IsValidUTF8(std::string_view text) noexcept;

// Whether a text of unknown encoding is meant as UTF-8, although some of its bytes may be
// malformed: it begins with the mark, or has more well-formed characters beyond ASCII than
// malformed bytes. Text of a code page hardly ever has more of the former: in windows-1252 each
// would be a letter with an accent followed by a symbol or punctuation, and any other letter with
// an accent is a malformed byte.
bool IsMeantAsUTF8(std::string_view text) noexcept;

struct MalformedByte {
  size_t offset = 0;               // from the start of the text, its mark included
  size_t line = 0;                 // from 1; U+2028 and U+2029 end lines too
  size_t column = 0;               // from 1, in code points; the mark is none
  std::string_view lineText = {};  // without its end
};

// The first malformed byte of each line that has one, up to `most` of them. The result borrows the
// text.
std::vector<MalformedByte> FindMalformedUTF8(std::string_view text, size_t most);
