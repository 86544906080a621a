// UTF-8, which the command speaks, and UTF-16, which dictionaries speak.
#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

// Damaged text is replaced as translations replace it. Throws OVErrException where the text or the
// result has more than 2^31 - 1 bytes or units.
std::string ToUTF8(std::span<const uint16_t> units);
std::vector<uint16_t> ToUTF16(std::string_view text);

bool IsValidUTF8(std::string_view text);
