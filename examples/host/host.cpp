// A minimal host: runs the embedded kernel with the plug-in, loads a dictionary, and translates a
// key in the two ways there are. Ends with status 0 when all went well and nothing was left alive.
//
//   host PLUG-IN DICTIONARY KEY

#include <cstdint>
#include <cstring>
#include <exception>
#include <fstream>
#include <iostream>
#include <iterator>
#include <stdexcept>
#include <string>
#include <vector>

#include "Data.h"
#include "Exceptions.h"
#include "VRKStringTranslatorClient.h"
#include "VRKStringTranslatorProtocol.h"
#include "VRKTranslationImage.h"
#include "VarnelKernelHost.h"

namespace {

std::string ReadFile(const char* name) {
  std::ifstream file(name, std::ios::binary);
  if (!file) throw std::runtime_error(std::string("cannot read ") + name);
  return {std::istreambuf_iterator<char>(file), {}};
}

uint32_t Count(size_t count) {
  if (count > UINT32_MAX) throw std::length_error("too long");
  return static_cast<uint32_t>(count);
}

void Print(const char* way, const std::string& translation) {
  std::cout << way << ": " << translation.c_str() << '\n';  // without the 0 that ends it
}

void Translate(const std::string& dictionary, const std::string& key) {
  // A translator object, which dies with the client. The dictionary goes over as it is.
  const auto translator = Varnel::CreateStringTranslator();
  const auto image = Varnel::PackTranslationImage(dictionary.data(), Count(dictionary.size()));
  translator->SetTranslations(image.units.get(), image.unitCount);

  // A message to the object. The translation ends in a 0 unit.
  std::vector<uint16_t> units;
  translator->TranslateString(key.data(), Count(key.size()), units);
  Print("message", Varnel::GetUTF8(Varnel::MakeUTF16LEData(units.data(), Count(units.size()))));

  // The coercion of a key, wherever data is read as text. The default translator translates it.
  translator->MakeDefault();
  const Varnel::DataRef data =
      Varnel::MakeData(Varnel::kTypeLocaleIndependentUTF8, key.data(), Count(key.size()));
  Print("coercion", Varnel::GetUTF8(data));
}

}  // namespace

int main(int argc, char** argv) try {
  if (argc != 4) return std::cerr << "usage: host PLUG-IN DICTIONARY KEY\n", 2;
  VRKPlugIn plugIn{};
  Varnel::ThrowIfFailed(VRKHostStart());
  const VRKResult loaded = VRKHostPlugInLoad(argv[1], "VRKKolvanes", &plugIn);
  if (loaded == kVRKNotFound) throw std::runtime_error(VRKHostLoadError());
  Varnel::ThrowIfFailed(loaded);
  Varnel::ThrowIfFailed(VRKHostPlugInInitialize(plugIn));
  Translate(ReadFile(argv[2]), argv[3]);
  Varnel::ThrowIfFailed(VRKHostPlugInTerminate(plugIn));
  Varnel::ThrowIfFailed(VRKHostPlugInUnload(plugIn));
  VRKHostLiveCounts left{};
  Varnel::ThrowIfFailed(VRKHostShutDown(&left));
  const VRKHostLiveCounts nothing{};
  return std::memcmp(&left, &nothing, sizeof left) == 0 ? 0 : 1;
} catch (const Varnel::Exception& error) {
  std::cerr << "host: result " << error.GetResultCode() << '\n';
  return 1;
} catch (const std::exception& error) {
  std::cerr << "host: " << error.what() << '\n';
  return 1;
}
