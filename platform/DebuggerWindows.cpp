#include <windows.h>

#include "platform/Debugger.h"

namespace platform {

void BreakIntoDebugger() noexcept {
  ::DebugBreak();
}

}  // namespace platform
