// The files that peers load, made from a key set by the peers' own compilers.
#pragma once

#include <filesystem>
#include <functional>
#include <iosfwd>
#include <string>

#include "bench/kolvane/lib/KeySet.h"

// Makes `FOLDER/de/LC_MESSAGES/bench.mo` with msgfmt, unless it exists. Two subjects load it.
std::filesystem::path CatalogueFile(const KeySet& set, const std::filesystem::path& folder);

// Writes a source file.
void WriteSource(const std::filesystem::path& path, const std::function<void(std::ostream&)>& fill);

// Links the file under a new name in its folder and returns that name without the extension: for
// peers that load a file only once.
std::string OneMoreName(const std::filesystem::path& file);

// Runs a command line, split at spaces. Throws if it fails.
void RunCompiler(const std::string& command);

// Returns the text with a backslash before each backslash and quote.
std::string InQuotes(std::string_view text);
