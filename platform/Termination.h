// Delays termination requests: signals, Ctrl-C, the closing of a console.
#pragma once

namespace platform {

// Termination requests take effect when the object is destroyed. It cannot delay SIGKILL or
// TerminateProcess. Requires: one object at a time.
class DelayedTermination {
 public:
  DelayedTermination() noexcept;
  DelayedTermination(const DelayedTermination&) = delete;
  DelayedTermination& operator=(const DelayedTermination&) = delete;
  ~DelayedTermination();
};

}  // namespace platform
