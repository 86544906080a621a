// What becomes of a failed check where the host has no reporter of its own.
#pragma once

#include <cstdint>

#include "VarnelKernelHost.h"

namespace varnel_kernel {

// Prints one line on standard error, sets the once-flag and asks for no debugger.
uint32_t VRK_CALL PrintReport(uint32_t severity, const char* domain, const char* expression,
                              const char* sourceFile, uint32_t line, const char* function,
                              uint32_t* onceFlag, void* context);

}  // namespace varnel_kernel
