#include "ErrorReports.h"

#include <cstdio>

namespace varnel_kernel {

uint32_t VRK_CALL PrintReport(uint32_t, const char* domain, const char* expression,
                              const char* sourceFile, uint32_t line, const char* function,
                              uint32_t* onceFlag, void*) {
  static_cast<void>(std::fprintf(stderr, "%s:%u: %s: check failed: %s [%s]\n", sourceFile, line,
                                 function, expression, domain));
  if (onceFlag != nullptr) *onceFlag = 1;
  return 0;
}

}  // namespace varnel_kernel
