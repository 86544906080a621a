// What a dictionary file holds, as a translator has it once it is loaded.
#pragma once

#include <vector>

#include "kolvane/lib/DictionaryTable.h"
#include "tools/kolvane/dictionary/ImageFile.h"

// Loads the file, and returns how that went. Throws what DictionaryTable's Load throws.
LoadStatus LoadInto(DictionaryTable& table, const ImageFile& file);

// The entries that lookups find of a file that the table has loaded: each key once, in the order in
// which the file names them first. They stay the table's.
std::vector<const tovali_private::DictionaryEntry*> EntriesInFileOrder(DictionaryTable& table,
                                                                       const ImageFile& file);
