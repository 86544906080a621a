#include "PlugInRun.h"

#include <cstring>
#include <string>

#include "Input.h"
#include "SharedLibrary.h"

namespace {

bool KeepLibrary() {
  std::string reason;
  return platform::LoadSharedLibrary(PLUG_IN, reason) != nullptr;
}

}  // namespace

VRKHostLiveCounts LiveCounts() {
  VRKHostLiveCounts counts{};
  Require(VRKHostGetLiveCounts(&counts) == 0, "a running kernel can be asked what lives");
  return counts;
}

bool IsNothing(const VRKHostLiveCounts& counts) {
  constexpr VRKHostLiveCounts kNothing{};
  return std::memcmp(&counts, &kNothing, sizeof counts) == 0;
}

PlugInRun::PlugInRun() {
  static const bool isKept = KeepLibrary();
  Require(isKept && VRKHostStart() == 0, "a kernel starts");
  Require(VRKHostPlugInLoad(PLUG_IN, "VRKKolvanes", &plugIn) == 0, "the plug-in is loaded");
}

PlugInRun::~PlugInRun() {
  Require(VRKHostPlugInUnload(plugIn) == 0, "the plug-in can go");
  VRKHostLiveCounts left{};
  Require(VRKHostShutDown(&left) == 0 && IsNothing(left), "and nothing is left");
}
