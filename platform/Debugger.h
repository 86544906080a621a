// Debugger breakpoints.
#pragma once

namespace platform {

// Stops in the debugger, which can continue execution. Ends the process if there is no debugger.
void BreakIntoDebugger() noexcept;

}  // namespace platform
