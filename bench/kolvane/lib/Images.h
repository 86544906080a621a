// Dictionary images of a key set.
#pragma once

#include <filesystem>
#include <string>

#include "bench/kolvane/lib/KeySet.h"

enum class ImageKind { kUTF16, kCodePage, kBinary };

// Writes the image into the folder, unless it exists, and returns its path. Throws: LeftOut if an
// image of that kind cannot hold the set.
std::filesystem::path ImageFile(ImageKind kind, const KeySet& set,
                                const std::filesystem::path& folder);

std::string ReadWholeFile(const std::filesystem::path& path);
