// Prints what this system's conversion makes of each case, for conversion-results.txt.
#include <cstdio>

#include "tests/platform/ConversionResults.h"

int main() {
  for (const std::string& line : ConversionResults()) std::printf("%s\n", line.c_str());
}
