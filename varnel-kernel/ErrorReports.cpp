#include "varnel-kernel/ErrorReports.h"

#include <cstdio>

namespace varnel_kernel {
namespace {

uint32_t VRK_CALL Print(uint32_t, const char* domain, const char* expression,
                        const char* sourceFile, uint32_t line, const char* function,
                        uint32_t* onceFlag, void*) {
  if (onceFlag != nullptr && *onceFlag != 0) return 0;
  static_cast<void>(std::fprintf(stderr, "%s:%u: %s: check failed: %s [%s]\n", sourceFile, line,
                                 function, expression, domain));
  if (onceFlag != nullptr) *onceFlag = 1;
  return 0;
}

}  // namespace

void ErrorReports::Set(VRKHostErrorReporter newReporter, void* newContext) noexcept {
  reporter = newReporter;
  context = newContext;
}

uint32_t ErrorReports::Report(uint32_t severity, const char* domain, const char* expression,
                              const char* sourceFile, uint32_t line, const char* function,
                              uint32_t* onceFlag) noexcept {
  return CallOut(running, uint32_t{0}, reporter != nullptr ? reporter : Print, severity, domain,
                 expression, sourceFile, line, function, onceFlag, context);
}

}  // namespace varnel_kernel
