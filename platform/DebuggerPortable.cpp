#include <csignal>

#include "platform/Debugger.h"

namespace platform {

// Execution must be able to go on: __builtin_trap does not return.
void BreakIntoDebugger() noexcept {
#if defined(__i386__) || defined(__x86_64__)
  __asm__ volatile("int3");
#else
  std::raise(SIGTRAP);
#endif
}

}  // namespace platform
