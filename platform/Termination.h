// Requests from outside to end the program: signals, Ctrl-C, or a console that is closed.
#pragma once

namespace platform {

// While it lives, such a request waits; it takes effect right after. A program that is killed
// outright (SIGKILL, TerminateProcess) is not protected. Requires: one at a time.
class DelayedTermination {
 public:
  DelayedTermination() noexcept;
  DelayedTermination(const DelayedTermination&) = delete;
  DelayedTermination& operator=(const DelayedTermination&) = delete;
  ~DelayedTermination();
};

}  // namespace platform
