// The message about a file whose UTF-8 is malformed.
#pragma once

#include <optional>
#include <string>

#include "tools/kolvane/dictionary/ImageFile.h"

// One line that names the place of the first malformed byte; none for a file without such, or that
// is not read as UTF-8.
std::optional<std::string> MalformedText(const ImageFile& file);
