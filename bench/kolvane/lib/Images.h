// A key set as the images that the library loads.
#pragma once

#include <filesystem>
#include <string>

#include "bench/kolvane/lib/KeySet.h"

enum class ImageKind { kUTF16, kCodePage, kBinary };

// Writes the image into the folder, unless it is there, and returns its path. Throws LeftOut where
// an image of that kind cannot hold the set.
std::filesystem::path ImageFile(ImageKind kind, const KeySet& set,
                                const std::filesystem::path& folder);

std::string ReadWholeFile(const std::filesystem::path& path);
