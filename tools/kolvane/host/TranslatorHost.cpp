#include "tools/kolvane/host/TranslatorHost.h"

#include <fmt/format.h>

#include <filesystem>
#include <system_error>
#include <utility>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/cli/Paths.h"
#include "tools/kolvane/host/ResultText.h"

namespace {

void Require(VRKResult result, const std::string& what) {
  if (result != 0) throw Failure(fmt::format("{}: {}", what, ResultText(result)));
}

// A name alone would be searched for.
std::string AbsoluteName(const std::string& file) {
  std::error_code failed;
  const std::filesystem::path path = std::filesystem::absolute(PathOf(file), failed);
  return failed ? file : NameOf(path);
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

void TranslatorHost::LoadPlugIn(const std::optional<std::string>& file) {
  const std::string path = file ? AbsoluteName(*file) : KOLVANE_PLUG_IN;
  const std::string failure =
      fmt::format("cannot load the plug-in {}", Printable(file.value_or(path)));
  const VRKResult loaded = VRKHostPlugInLoad(path.c_str(), "VRKKolvanes", &plugIn);
  if (loaded == kVRKNotFound) {
    throw Failure(fmt::format("{}: {}", failure, Printable(VRKHostLoadError())));
  }
  Require(loaded, failure);
  Require(VRKHostPlugInInitialize(plugIn), "the plug-in cannot be initialised");
}

void TranslatorHost::Close() {
  const VRKPlugIn closing = std::exchange(plugIn, {});
  Require(VRKHostPlugInTerminate(closing), "the plug-in cannot be terminated");
  Require(VRKHostPlugInUnload(closing), "the plug-in cannot be unloaded");
}
