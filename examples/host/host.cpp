// A minimal host: runs the embedded kernel with the plug-in, loads a dictionary, and translates a
// key by message and by coercion. Exits with 0 if everything succeeded and nothing leaked.
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
  std::cout << way << ": " << translation.c_str() << '\n';  // without the terminating 0
}

void Translate(const std::string& dictionary, const std::string& key) {
  // A translator object, owned by the client. The dictionary is sent byte for byte.
  const auto translator = Varnel::CreateStringTranslator();
  const auto image = Varnel::PackTranslationImage(dictionary.data(), Count(dictionary.size()));
  translator->SetTranslations(image.units.get(), image.unitCount);

  // By message. The translation ends in a 0 unit.
  std::vector<uint16_t> units;
  translator->TranslateString(key.data(), Count(key.size()), units);
  Print("message", Varnel::GetUTF8(Varnel::MakeUTF16LEData(units.data(), Count(units.size()))));

  // By coercion: reading key data as text translates it with the default translator.
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
