// The built plug-in, in a kernel, as a host sees it.
#pragma once

#include <string>

#include "Data.h"
#include "SharedLibrary.h"
#include "Support.h"
#include "Tokens.h"
#include "VRKStringTranslatorClient.h"
#include "VRKStringTranslatorProtocol.h"

class PlugInTest : public KernelTest {
 protected:
  PlugInTest() { EXPECT_EQ(VRKHostPlugInLoad(PLUG_IN, "VRKKolvanes", &plugIn), 0u) << VRKHostLoadError(); }
  ~PlugInTest() override { EXPECT_EQ(VRKHostPlugInUnload(plugIn), 0u); }

  VRKPlugIn plugIn{};
};

// The library as a host loads it that has a loader of its own.
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

// A key's translation, in UTF-8, by the plug-in's coercion.
inline std::string Coerced(const std::string& key) {
  const auto byteCount = static_cast<uint32_t>(key.size());
  std::string text = Varnel::GetUTF8(Varnel::MakeData(Varnel::kTypeLocaleIndependentUTF8, key.data(), byteCount));
  EXPECT_TRUE(text.ends_with('\0'));
  text.pop_back();
  return text;
}

// And by a translator object, without the 0 unit that ends it.
inline std::vector<uint16_t> TranslatedBy(Varnel::StringTranslatorInterface& translator, const std::string& key) {
  std::vector<uint16_t> units;
  translator.TranslateString(key.data(), static_cast<uint32_t>(key.size()), units);
  EXPECT_EQ(units.back(), 0u);
  units.pop_back();
  return units;
}
