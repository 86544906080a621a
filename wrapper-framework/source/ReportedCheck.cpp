#include "wrapper-framework/source/ReportedCheck.h"

#include "platform/Debugger.h"
#include "wrapper-framework/source/VarnelKernel.h"

namespace Varnel {

void ReportFailedCheck(CheckSite& site) noexcept {
  constexpr uint32_t kFailedCheck = 2;
  constexpr uint32_t kBreak = 0xFF;
  const uint32_t answer =
      VRKRuntimeError(kFailedCheck, site.domain, site.condition, 0, site.sourceFile, site.line,
                      site.function, &site.onceFlag);
  if ((answer & kBreak) != 0) platform::BreakIntoDebugger();
}

}  // namespace Varnel
