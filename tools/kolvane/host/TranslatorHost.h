// The kernel that the command runs, and the plug-in in it.
#pragma once

#include <optional>
#include <string>

#include "varnel-kernel/VarnelKernelHost.h"

// Each throws Failure with the reason. Translators are to be gone when a host ends.
class TranslatorHost {
 public:
  TranslatorHost();
  TranslatorHost(const TranslatorHost&) = delete;
  TranslatorHost& operator=(const TranslatorHost&) = delete;
  ~TranslatorHost();  // ends quietly what Close has not ended

  // Loads and initialises the plug-in. Without a file it is the command's own, searched for as the
  // kernel does.
  void LoadPlugIn(const std::optional<std::string>& file);

  void Close();

 private:
  VRKPlugIn plugIn{};
};
