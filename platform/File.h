// Files by their names in UTF-8.
#pragma once

#include <cstdio>

namespace platform {

// As std::fopen.
std::FILE* OpenFile(const char* name, const char* mode);

}  // namespace platform
