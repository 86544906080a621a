#include <windows.h>

#include "tests/platform/Breaks.h"

namespace {

int gBreaks = 0;

LONG CALLBACK GoOn(EXCEPTION_POINTERS* exception) {
  if (exception->ExceptionRecord->ExceptionCode != EXCEPTION_BREAKPOINT) return EXCEPTION_CONTINUE_SEARCH;
  ++gBreaks;
  ++exception->ContextRecord->Eip;  // past the instruction of one byte
  return EXCEPTION_CONTINUE_EXECUTION;
}

}  // namespace

int BreaksOf(const std::function<void()>& run) {
  gBreaks = 0;
  void* const handler = ::AddVectoredExceptionHandler(1, GoOn);
  run();
  ::RemoveVectoredExceptionHandler(handler);
  return gBreaks;
}
