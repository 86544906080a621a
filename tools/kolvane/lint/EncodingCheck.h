// What is wrong with the bytes of a text dictionary, before they are lines.
#pragma once

#include <vector>

#include "tools/kolvane/dictionary/ImageFile.h"
#include "tools/kolvane/lint/Finding.h"

// Returns whether the lines are worth a look: those of text whose encoding is mistaken are not.
// `encoding` is the one that the file was read with.
bool CheckEncoding(const ImageFile& file, FileEncoding encoding, std::vector<Finding>& findings);
