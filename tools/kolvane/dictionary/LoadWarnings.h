// What a user should know of a load that did not go as the file promised.
#pragma once

#include "tools/kolvane/dictionary/DictionaryFile.h"

// Loads the file and reports on standard error, with the file's name and the place:
// - an error for what could not be read: the file is empty, cut short or damaged, or holds
// malformed
//   UTF-8;
// - a warning for what was read but may not be meant: the file adds nothing, or lines were dropped.
//
// Returns whether there was no error. Throws Failure for what is plainly no dictionary
// (FileKind.h), of which nothing is loaded, and what LoadInto throws.
bool LoadWithWarnings(DictionaryTable& table, const ImageFile& file);
