// How reports write down where something is.
#pragma once

#include <filesystem>
#include <string>
#include <string_view>

#include "tools/kolvane/lint/Finding.h"

// `de.txt:12:9`, `de.bin: entry 12, byte 345`, or `de.txt` for a file as a whole. Printable.
std::string PlaceText(const Place& place);

// `entry 12, byte 345`; empty where the place is none in a binary image.
std::string BinaryPosition(const Place& place);

// Where it is true, names may have backslashes between folders, and a drive at their start.
inline constexpr bool kHasDrives = std::filesystem::path::preferred_separator == '\\';

// The file's name with slashes between its folders and without `./` at its start, so that one file
// has one name on all machines.
std::string PortableName(const std::string& file);

// The text with each byte that is special written as `%` and two hexadecimal digits.
std::string PercentEncoded(std::string_view text, bool (*isSpecial)(char));
