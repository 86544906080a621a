// The built plug-in in a kernel, for one walk.
#pragma once

#include <cstring>
#include <string>

#include "fuzz/Input.h"
#include "platform/SharedLibrary.h"
#include "varnel-kernel/VarnelKernelHost.h"

// How many handles, registrations and blocks are alive.
inline VRKHostLiveCounts LiveCounts() {
  VRKHostLiveCounts counts{};
  Require(VRKHostGetLiveCounts(&counts) == 0, "a running kernel can be asked what lives");
  return counts;
}

// Starts the kernel and loads the plug-in; ends both, and requires that nothing is left by then.
// The library stays in memory meanwhile and after, so that walks may follow each other fast.
class PlugInRun {
 public:
  PlugInRun() {
    static std::string reason;
    static const bool isKept = platform::LoadSharedLibrary(PLUG_IN, reason) != nullptr;
    Require(isKept && VRKHostStart() == 0, "a kernel starts");
    Require(VRKHostPlugInLoad(PLUG_IN, "VRKKolvanes", &plugIn) == 0, "the plug-in is loaded");
  }
  ~PlugInRun() {
    constexpr VRKHostLiveCounts kNothing{};
    VRKHostLiveCounts left{};
    Require(VRKHostPlugInUnload(plugIn) == 0, "the plug-in can go");
    Require(VRKHostShutDown(&left) == 0, "the kernel can end");
    Require(std::memcmp(&left, &kNothing, sizeof left) == 0, "and nothing is left");
  }
  PlugInRun(const PlugInRun&) = delete;
  PlugInRun& operator=(const PlugInRun&) = delete;

  VRKPlugIn Handle() const { return plugIn; }

 private:
  VRKPlugIn plugIn{};
};
