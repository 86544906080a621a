#include "platform/File.h"
#include "platform/WideText.h"

namespace platform {

std::FILE* OpenFile(const char* name, const char* mode) {
  return _wfopen(WideFromUTF8(name).c_str(), WideFromUTF8(mode).c_str());
}

}  // namespace platform
