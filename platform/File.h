// Files with UTF-8 names.
#pragma once

#include <cstdio>

namespace platform {

// As std::fopen.
std::FILE* OpenFile(const char* name, const char* mode);

}  // namespace platform
