#include "Debugger.h"

namespace platform {

void BreakIntoDebugger() noexcept {
#if defined(__i386__) || defined(__x86_64__)
  __asm__ volatile("int3");
#else
  __builtin_trap();
#endif
}

}  // namespace platform
