#include "TranslatorHost.h"

#include <fmt/format.h>

#include <filesystem>
#include <system_error>
#include <utility>

#include "Messages.h"
#include "ResultText.h"

namespace {

void Require(VRKResult result, const std::string& what) {
  if (result != 0) throw Failure(fmt::format("{}: {}", what, ResultText(result)));
}

// A name alone would be searched for.
std::string PathOf(const std::string& file) {
  std::error_code failed;
  const std::filesystem::path name(std::u8string(file.begin(), file.end()));
  const std::u8string path = std::filesystem::absolute(name, failed).u8string();
  return failed ? file : std::string(path.begin(), path.end());
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
  const std::string path = file ? PathOf(*file) : KOLVANE_PLUG_IN;
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
