// The traffic with the kernel, for people to read.
#pragma once

#include <string>

#include "varnel-kernel/VarnelKernelHost.h"

// Prints each call of a kernel operation on standard error while it lives, but for those that
// retain or release the null handle: the operation, what goes in and, after an arrow, what comes
// out; in braces the calls that were made meanwhile. Data come with a glimpse of what is in them.
// One at a time, with the kernel running.
class KernelTrace {
 public:
  KernelTrace();
  KernelTrace(const KernelTrace&) = delete;
  KernelTrace& operator=(const KernelTrace&) = delete;
  ~KernelTrace();

 private:
  static VRKResult VRK_CALL Hook(const VRKHostTraceCall* call, void* context);

  void Enter(const VRKHostTraceCall& call);
  void Leave(const VRKHostTraceCall& call);
  void Print();

  std::string line;     // what is not printed yet
  bool isOpen = false;  // the line tells of a call that has not ended
};
