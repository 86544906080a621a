#include <windows.h>

#include "Debugger.h"

namespace platform {

void BreakIntoDebugger() noexcept {
  ::DebugBreak();
}

}  // namespace platform
