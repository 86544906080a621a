// One directive of a printf format, such as %d or %2$-*3$.4lls.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <tuple>

// Arguments of different types cannot stand for each other: they would be read wrongly.
struct ArgumentType {
  // The conversion d, u, f, c, C, s, S, p or n, which stands for others that take the same: d for
  // i; u for o, x and X; f for every floating-point number.
  char conversion;
  char size;  // 0 or a length modifier: H for hh, h, l, q for 64 bits, L, or z for pointers' size

  bool operator<(const ArgumentType& other) const {
    return std::tie(conversion, size) < std::tie(other.conversion, other.size);
  }
};

struct PrintfArgument {
  size_t number;  // from 1, or 0 for the next one in order
  ArgumentType type;
};

struct PrintfDirective {
  size_t length = 0;  // in units
  std::array<PrintfArgument, 3> arguments{};
  size_t argumentCount = 0;  // in the order in which they are read, a width and a precision first
};

// What a text that begins with `%` begins with. Nothing where that is no directive, or one that
// only looks like it: a space as a flag makes none, for `% c` is in `100% complete`, nor does a
// minus sign without a width, as in `50%-os`, or a number that is 0 or above 9999. `%%` is no
// directive here.
std::optional<PrintfDirective> ParsePrintfDirective(std::span<const uint16_t> text);
