// Checks that failed, and who is told of them.
#pragma once

#include <cstdint>

#include "Callbacks.h"
#include "VarnelKernelHost.h"

namespace varnel_kernel {

class ErrorReports {
 public:
  explicit ErrorReports(RunningCode*& innermostCode) : running(innermostCode) {}

  // Null for the kernel's own reporter, which prints a report on standard error, once for each
  // site.
  void Set(VRKHostErrorReporter newReporter, void* newContext) noexcept;
  VRKHostErrorReporter Reporter() const noexcept { return reporter; }

  // Returns what the reporter returns.
  uint32_t Report(uint32_t severity, const char* domain, const char* expression,
                  const char* sourceFile, uint32_t line, const char* function,
                  uint32_t* onceFlag) noexcept;

 private:
  RunningCode*& running;
  VRKHostErrorReporter reporter = nullptr;
  void* context = nullptr;
};

}  // namespace varnel_kernel
