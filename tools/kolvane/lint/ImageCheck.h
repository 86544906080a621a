// What is wrong with a binary dictionary.
#pragma once

#include <vector>

#include "tools/kolvane/dictionary/ImageFile.h"
#include "tools/kolvane/lint/Definitions.h"
#include "tools/kolvane/lint/Finding.h"

// Reports damage of the image and of its entries, and gives the definitions that lookups find in
// what could be read of it. Throws std::bad_alloc.
Definitions CheckImage(const ImageFile& file, std::vector<Finding>& findings);
