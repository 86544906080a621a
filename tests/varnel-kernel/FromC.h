// The kernel's interface used from C.
#pragma once

#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

// Makes three calls on the running kernel and returns how many the trace hook heard of.
uint32_t CountCallsFromC(void);

#ifdef __cplusplus
}
#endif
