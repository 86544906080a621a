// What a user should know of a load that did not go as the file promised.
#pragma once

#include <string>
#include <vector>

#include "DictionaryFile.h"

// One line for each, naming the file and the reason: the file is empty or adds nothing, is cut
// short or damaged (with the place), lines were dropped (with their number).
std::vector<std::string> WarningsOf(const ImageFile& file, const LoadStatus& status);

// Loads the file and says its warnings. Returns whether it is whole. Throws what LoadInto throws.
bool LoadWithWarnings(DictionaryTable& table, const ImageFile& file);
