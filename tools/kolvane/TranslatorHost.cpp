#include "TranslatorHost.h"

#include <fmt/format.h>

#include <filesystem>
#include <utility>

#include "Messages.h"
#include "ResultText.h"

namespace {

void Require(VRKResult result, const char* what) {
  if (result != 0) throw Failure(fmt::format("{}: {}", what, ResultText(result)));
}

// A name alone would be searched for.
std::string PathOf(const std::string& file) {
  return file.empty() ? KOLVANE_PLUG_IN : std::filesystem::absolute(file).string();
}

}  // namespace

TranslatorHost::TranslatorHost() {
  Require(VRKHostStart(), "cannot start the kernel");
}

TranslatorHost::~TranslatorHost() {
  VRKHostPlugInTerminate(plugIn);
  VRKHostPlugInUnload(plugIn);
  VRKHostShutDown(nullptr);
}

void TranslatorHost::LoadPlugIn(const std::string& file) {
  const std::string path = PathOf(file);
  if (VRKHostPlugInLoad(path.c_str(), "VRKKolvanes", &plugIn) == kVRKNotFound) {
    throw Failure(fmt::format("cannot load the plug-in {}: {}",
                              Printable(file.empty() ? path : file),
                              Printable(VRKHostLoadError())));
  }
  Require(VRKHostPlugInInitialize(plugIn), "the plug-in cannot be initialised");
}

void TranslatorHost::Close() {
  Require(VRKHostPlugInTerminate(plugIn), "the plug-in cannot be terminated");
  Require(VRKHostPlugInUnload(std::exchange(plugIn, {})), "the plug-in cannot be unloaded");
}
