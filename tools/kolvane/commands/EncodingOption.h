// The option that says how text files are encoded, which all commands take that read dictionaries.
#pragma once

#include "tools/kolvane/cli/CommandLine.h"
#include "tools/kolvane/dictionary/ImageFile.h"

// Adds `--encoding` to the group that was begun last; `encoding` outlives the parsing.
void AddEncodingOption(CommandLine& commandLine, FileEncoding& encoding);
