// What hosts say to translators, and hear from them.
#pragma once

#include <string>
#include <vector>

#include "kolvane/api/VRKStringTranslatorInterface.h"
#include "kolvane/api/wrapper-framework/VRKTranslationImage.h"
#include "wrapper-framework/source/Data.h"
#include "wrapper-framework/source/Tokens.h"

inline Varnel::DataRef DataOf(const char* type, const std::string& bytes) {
  return Varnel::MakeData(type, bytes.data(), static_cast<uint32_t>(bytes.size()));
}

inline std::string RawText(const Varnel::DataRef& data) {
  const Varnel::RawPayload payload = Varnel::GetRawPayload(data);
  return {static_cast<const char*>(payload.bytes), payload.byteCount};
}

inline Varnel::DictionaryRef With(const char* parameter, const Varnel::DataRef& data) {
  Varnel::DictionaryRef parameters;
  parameters.Create();
  parameters.SetEntry(Varnel::MakeToken(parameter), data);
  return parameters;
}

inline VRKResult Send(VRKObject to, const char* message, const Varnel::DictionaryRef& parameters = {}) {
  return VRKObjectDeliverMessage(to, Varnel::MakeToken(message), parameters.Get(), 1);
}

inline void Load(Varnel::StringTranslatorInterface& translator, const std::string& bytes) {
  const auto image = Varnel::PackTranslationImage(bytes.data(), static_cast<uint32_t>(bytes.size()));
  translator.SetTranslations(image.units.get(), image.unitCount);
}

// A translation, with the 0 unit that ends it; of each unit, the low byte.
inline std::string Translated(Varnel::StringTranslatorInterface& translator, const std::string& key) {
  std::vector<uint16_t> units(10, 'x');
  translator.TranslateString(key.data(), static_cast<uint32_t>(key.size()), units);
  return {units.begin(), units.end()};
}
