// Forwards reports of failed checks to the installed reporter.
#pragma once

#include <cstdint>

#include "varnel-kernel/Callbacks.h"
#include "varnel-kernel/VarnelKernelHost.h"

namespace varnel_kernel {

class ErrorReports {
 public:
  explicit ErrorReports(ActiveCallback*& innermostCode) : running(innermostCode) {}

  // Null restores the kernel's own reporter, which prints each failed check once on standard error.
  void Set(VRKHostErrorReporter newReporter, void* newContext) noexcept;
  VRKHostErrorReporter Reporter() const noexcept { return reporter; }

  // Returns the reporter's result.
  uint32_t Report(uint32_t severity, const char* domain, const char* expression,
                  const char* sourceFile, uint32_t line, const char* function,
                  uint32_t* onceFlag) noexcept;

 private:
  ActiveCallback*& running;
  VRKHostErrorReporter reporter = nullptr;
  void* context = nullptr;
};

}  // namespace varnel_kernel
