// A key set as the files that the peers load, made by the peers' own compilers.
#pragma once

#include <filesystem>
#include <functional>
#include <iosfwd>
#include <string>

#include "bench/kolvane/lib/KeySet.h"

// `FOLDER/de/LC_MESSAGES/bench.mo`, unless it is there, by msgfmt; for both that load such files.
std::filesystem::path CatalogueFile(const KeySet& set, const std::filesystem::path& folder);

// Fills a source file.
void WriteSource(const std::filesystem::path& path, const std::function<void(std::ostream&)>& fill);

// Gives the file one more name in its folder, and returns that without the extension: for peers
// that load a file only once.
std::string OneMoreName(const std::filesystem::path& file);

// Runs a program and its arguments, parted by spaces; throws when it fails.
void RunCompiler(const std::string& command);

// With a backslash before each backslash and quote.
std::string InQuotes(std::string_view text);
