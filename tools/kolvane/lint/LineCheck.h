// What a translator silently forgives in a line of text.
#pragma once

#include <string>
#include <vector>

#include "tools/kolvane/dictionary/TextLines.h"
#include "tools/kolvane/lint/Definitions.h"
#include "tools/kolvane/lint/Finding.h"

// The place of a unit of the line.
Place PlaceIn(const std::string& file, const TextLine& line, size_t unit);

// Reports what is wrong with a line of the file, and puts what it defines among the definitions of
// the lines before it.
void CheckLine(const std::string& file, const TextLine& line, Definitions& definitions,
               std::vector<Finding>& findings);
