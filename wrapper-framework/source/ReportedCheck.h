// Checks that must not stop the program: a failure is reported to the kernel, and execution goes
// on.
#pragma once

#include <cstdint>

namespace Varnel {

// What a report says of the place where the check stands. Each place owns a static one.
struct CheckSite {
  const char* domain;
  const char* condition;   // as written in the source
  const char* sourceFile;  // its path in the source tree
  uint32_t line;
  const char* function;   // its qualified name
  uint32_t onceFlag = 0;  // written by the kernel only; the check is skipped once it is set
};

// Reports, and breaks into the debugger if the kernel asks for it.
void ReportFailedCheck(CheckSite& site) noexcept;

// Throws what the condition throws. A check that is skipped does not evaluate its condition.
template <class Condition>
void ReportedCheck(CheckSite& site, Condition&& condition) {
  if (site.onceFlag == 0 && !condition()) ReportFailedCheck(site);
}

}  // namespace Varnel
