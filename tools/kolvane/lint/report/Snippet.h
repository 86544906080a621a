// The line that a finding is about, as a terminal can show it.
#pragma once

#include <string>

#include "tools/kolvane/lint/Finding.h"

struct Snippet {
  std::string line;    // printable but for its tabs; where it is long, cut around the place
  std::string indent;  // as wide as what stands before the place
};

// The place must be one in a line.
Snippet SnippetOf(const Place& place);
