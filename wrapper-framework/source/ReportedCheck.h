// Checks that must not stop the program: a failure is reported to the kernel and execution
// continues.
#pragma once

#include <cstdint>

namespace Varnel {

// The place of a check, as reports name it. Each check has a static one.
struct CheckSite {
  const char* domain;
  const char* condition;   // as written in the source
  const char* sourceFile;  // its path in the source tree
  uint32_t line;
  const char* function;   // its qualified name
  uint32_t onceFlag = 0;  // written by the kernel only; if not 0, the check is skipped
};

// Reports the failure, and breaks into the debugger if the kernel asks for it.
void ReportFailedCheck(CheckSite& site) noexcept;

// Evaluates the condition, unless the check is skipped, and reports if it is false.
template <class Condition>
void ReportedCheck(CheckSite& site, Condition&& condition) {
  if (site.onceFlag == 0 && !condition()) ReportFailedCheck(site);
}

}  // namespace Varnel
