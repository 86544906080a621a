#include <windows.h>

#include "platform/Termination.h"

namespace platform {
namespace {

SRWLOCK gLock = SRWLOCK_INIT;

// Runs on a thread of the system's own. The handler after this one ends the program.
BOOL WINAPI WaitForLock(DWORD) {
  ::AcquireSRWLockShared(&gLock);
  ::ReleaseSRWLockShared(&gLock);
  return FALSE;
}

}  // namespace

DelayedTermination::DelayedTermination() noexcept {
  ::AcquireSRWLockExclusive(&gLock);
  ::SetConsoleCtrlHandler(&WaitForLock, TRUE);
}

// The lock goes first: a waiting handler may keep the list of handlers locked.
DelayedTermination::~DelayedTermination() {
  ::ReleaseSRWLockExclusive(&gLock);
  ::SetConsoleCtrlHandler(&WaitForLock, FALSE);
}

}  // namespace platform
