// Stopping for whoever debugs.
#pragma once

namespace platform {

// Stops in the debugger, from where execution can go on. Without one the process ends.
void BreakIntoDebugger() noexcept;

}  // namespace platform
