// The places of a text that the program fills in.
//
// They are directives of printf (PrintfDirective.h), and names in braces, `{0}` or `{file-name}`:
// an ASCII letter, a digit or `_`, and more of these, `.` and `-`. A format may follow a name,
// behind a comma or behind a colon without white space after it, up to the brace that closes the
// name's: `{0:N2}`, `{size,8}`, `{n, plural, one {# file} other {# files}}`. What stands inside a
// format is no placeholder.
//
// Text is `{{` and `}}`, which write a brace, any other brace that begins no placeholder, and `%%`.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "tools/kolvane/text/PrintfDirective.h"

struct Argument {
  std::string id;     // the number of one of printf's, from "1", or `{name}`
  ArgumentType type;  // the same for all names
};

struct Placeholder {
  size_t start;         // in units
  size_t length;        // in units
  std::string written;  // as it is, but without the format behind a name
  bool isPrintf;
  std::vector<Argument> arguments;  // in the order in which they are read
};

struct Placeholders {
  std::vector<Placeholder> all;  // in their order in the text

  // The first that gives its arguments' numbers, and the first that takes the next argument; none
  // where empty. Numbers mean nothing in a text with both.
  std::string firstNumbered;
  std::string firstUnnumbered;

  // The text has a `%` that begins neither a directive nor `%%`, and none that does.
  bool isPlainPercent = false;

  bool MixesStyles() const { return !firstNumbered.empty() && !firstUnnumbered.empty(); }
};

Placeholders FindPlaceholders(std::span<const uint16_t> text);
