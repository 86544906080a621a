// What the conversion makes of adversarial and random texts.
#pragma once

#include <string>
#include <vector>

// A line for each case: its name, " = ", and the result in hexadecimal digits; or a name, " # " and a hash
// of many results. The same on every system, except for lines that begin with
// * "truncated": UTF-8 that ends in too few bytes for a lead byte, all of which Windows replaces;
// * "look-alike": a character that the code page lacks, and what Windows picks for it.
std::vector<std::string> ConversionResults();
