// What a user should know of a load that did not go as the file promised.
#pragma once

#include <string>
#include <vector>

#include "ImageFile.h"
#include "LoadStatus.h"

// One line for each: the file is empty or adds nothing, is cut short or damaged, lines were
// dropped. Each names the file, the reason and the place.
std::vector<std::string> WarningsOf(const ImageFile& file, const LoadStatus& status);
