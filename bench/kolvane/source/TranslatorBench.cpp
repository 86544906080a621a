// What the road through the kernel costs: a key, and an image, by way of the dictionary library
// alone and by way of a translator object.
#include <benchmark/benchmark.h>

#include <boost/interprocess/streams/bufferstream.hpp>
#include <cstdlib>
#include <string>
#include <vector>

#include "Data.h"
#include "KolvaneDictionary.h"
#include "TranslatedString.h"
#include "VRKStringTranslatorClient.h"
#include "VRKStringTranslatorProtocol.h"
#include "VRKTranslationImage.h"
#include "VarnelKernelHost.h"

namespace {

constexpr int kEntries = 5000;

std::string Key(int i) {
  return "$$$/Section" + std::to_string(i % 50) + "/Entry" + std::to_string(i) + "=Default text";
}

std::string Image() {
  std::string image;
  for (int i = 0; i < kEntries; ++i) {
    const std::string key = Key(i);
    image += '"' + key.substr(0, key.find('=')) + "=A translation of some length\"\n";
  }
  return image;
}

void Load(KolvaneDictionary& dictionary, const std::string& bytes) {
  boost::interprocess::ibufferstream image(bytes.data(), bytes.size());
  dictionary.Load(image);
}

void Load(Varnel::StringTranslatorInterface& translator, const std::string& bytes) {
  const auto image =
      Varnel::PackTranslationImage(bytes.data(), static_cast<uint32_t>(bytes.size()));
  translator.SetTranslations(image.units.get(), image.unitCount);
}

void TranslateByLibrary(benchmark::State& state) {
  KolvaneDictionary dictionary;
  Load(dictionary, Image());
  const std::string key = Key(kEntries / 2);
  std::vector<uint16_t> units;
  for (auto _ : state) {
    constexpr int kUTF8 = 1;
    const TranslatedString translated = dictionary.Translate(key.c_str(), &kUTF8);
    units.resize(translated.BufferSize());
    translated.CopyTo(units.data(), translated.BufferSize(), true);
  }
}

void TranslateByMessage(benchmark::State& state) {
  const auto translator = Varnel::CreateStringTranslator();
  Load(*translator, Image());
  const std::string key = Key(kEntries / 2);
  std::vector<uint16_t> units;
  for (auto _ : state) {
    translator->TranslateString(key.data(), static_cast<uint32_t>(key.size()), units);
  }
}

void TranslateByCoercion(benchmark::State& state) {
  const auto translator = Varnel::CreateStringTranslator();
  Load(*translator, Image());
  translator->MakeDefault();
  const std::string key = Key(kEntries / 2);
  const auto data = Varnel::MakeData(Varnel::kTypeLocaleIndependentUTF8, key.data(),
                                     static_cast<uint32_t>(key.size()));
  std::vector<uint16_t> units;
  for (auto _ : state) Varnel::GetUTF16LE(data, units);
}

void LoadByLibrary(benchmark::State& state) {
  const std::string image = Image();
  for (auto _ : state) {
    KolvaneDictionary dictionary;
    Load(dictionary, image);
  }
}

void LoadByMessage(benchmark::State& state) {
  const std::string image = Image();
  for (auto _ : state) Load(*Varnel::CreateStringTranslator(), image);
}

BENCHMARK(TranslateByLibrary);
BENCHMARK(TranslateByMessage);
BENCHMARK(TranslateByCoercion);
BENCHMARK(LoadByLibrary);
BENCHMARK(LoadByMessage);

}  // namespace

int main(int argc, char** argv) {
  VRKPlugIn plugIn{};
  if (VRKHostStart() != 0 || VRKHostPlugInLoad(PLUG_IN, "VRKKolvanes", &plugIn) != 0) std::abort();
  if (VRKHostPlugInInitialize(plugIn) != 0) std::abort();
  benchmark::Initialize(&argc, argv);
  benchmark::RunSpecifiedBenchmarks();
}
