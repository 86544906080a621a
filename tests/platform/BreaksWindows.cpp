#include <windows.h>

#include "tests/platform/Breaks.h"

namespace {

int gBreaks = 0;

auto& InstructionPointer(CONTEXT& context) {
#ifdef _WIN64
  return context.Rip;
#else
  return context.Eip;
#endif
}

LONG CALLBACK GoOn(EXCEPTION_POINTERS* exception) {
  if (exception->ExceptionRecord->ExceptionCode != EXCEPTION_BREAKPOINT) return EXCEPTION_CONTINUE_SEARCH;
  ++gBreaks;
  ++InstructionPointer(*exception->ContextRecord);  // past the instruction of one byte
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
