// The built plug-in in a kernel, for one walk.
#pragma once

#include "VarnelKernelHost.h"

// How many handles, registrations and blocks are alive.
VRKHostLiveCounts LiveCounts();
bool IsNothing(const VRKHostLiveCounts& counts);

// Starts the kernel and loads the plug-in; ends both, and requires that nothing is left by then.
// The library stays in memory meanwhile and after, so that walks may follow each other fast.
class PlugInRun {
 public:
  PlugInRun();
  ~PlugInRun();
  PlugInRun(const PlugInRun&) = delete;
  PlugInRun& operator=(const PlugInRun&) = delete;

  VRKPlugIn Handle() const { return plugIn; }

 private:
  VRKPlugIn plugIn{};
};
