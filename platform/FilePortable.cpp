#include "platform/File.h"

namespace platform {

std::FILE* OpenFile(const char* name, const char* mode) {
  return std::fopen(name, mode);
}

}  // namespace platform
