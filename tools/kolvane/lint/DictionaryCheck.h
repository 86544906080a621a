// Everything that is wrong with dictionaries.
#pragma once

#include <vector>

#include "tools/kolvane/dictionary/ImageFile.h"
#include "tools/kolvane/lint/Finding.h"

// The findings of each file in the order of its places, file by file. `reference` holds the texts
// that the files translate; of it only what keeps it from being read comes, before the rest. It may
// be null. `encoding` is the one that the files were read with. Throws std::bad_alloc.
std::vector<Finding> CheckDictionaries(const std::vector<ImageFile>& files,
                                       const ImageFile* reference, FileEncoding encoding);
