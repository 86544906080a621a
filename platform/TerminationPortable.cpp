#include <csignal>
#include <initializer_list>

#include "platform/Termination.h"

namespace platform {
namespace {

sigset_t gBefore;

}  // namespace

// SIGXCPU and SIGXFSZ ask too: a limit on time, or on the size of the file, was reached.
DelayedTermination::DelayedTermination() noexcept {
  sigset_t requests;
  sigemptyset(&requests);
  for (const int request : {SIGHUP, SIGINT, SIGQUIT, SIGTERM, SIGXCPU, SIGXFSZ}) {
    sigaddset(&requests, request);
  }
  sigprocmask(SIG_BLOCK, &requests, &gBefore);
}

DelayedTermination::~DelayedTermination() {
  sigprocmask(SIG_SETMASK, &gBefore, nullptr);
}

}  // namespace platform
