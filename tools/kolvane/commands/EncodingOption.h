// The option that says how text files are encoded, which all commands take that read dictionaries.
#pragma once

#include <CLI/CLI.hpp>

#include "tools/kolvane/dictionary/ImageFile.h"

// Adds `--encoding` to the group `Dictionaries`; `encoding` outlives the parsing.
void AddEncodingOption(CLI::App& options, FileEncoding& encoding);
