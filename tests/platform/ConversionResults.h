// What the conversion makes of adversarial and random texts.
#pragma once

#include <string>
#include <vector>

// A line for each case: its name, " = ", and the result in hexadecimal digits; or a name, " # " and a hash
// of many results. The same on every system, but for the lines that begin with "look-alike": what the
// system picks for a character that its code page lacks.
std::vector<std::string> ConversionResults();
