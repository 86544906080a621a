// The plug-in's library as a host loads it that has a loader of its own.
#pragma once

#include <string>

#include "platform/SharedLibrary.h"
#include "tests/wrapper-framework/Support.h"

struct EntryPoints {
  EntryPoints() { EXPECT_NE(library, nullptr) << reason; }
  ~EntryPoints() { platform::UnloadSharedLibrary(library); }
  EntryPoints(const EntryPoints&) = delete;
  EntryPoints& operator=(const EntryPoints&) = delete;

  template <class Function>
  Function* Find(const char* name) const {
    return reinterpret_cast<Function*>(platform::FindFunction(library, name));
  }

  std::string reason;
  platform::SharedLibrary library = platform::LoadSharedLibrary(PLUG_IN, reason);
  VRKResult (*initialize)(uint32_t) = Find<VRKResult(uint32_t)>("VRKKolvanesInitialize");
  VRKResult (*terminate)(uint32_t) = Find<VRKResult(uint32_t)>("VRKKolvanesTerminate");
  uint32_t (*version)() = Find<uint32_t()>("VRKKolvanesVersion");
};
