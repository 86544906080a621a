// `soak COUNT` delivers that many messages and coercions, or a few more, to translators that come
// and go in one process, compares every answer with the model's, and reloads one translator that
// stays over and over. Ten times it comes to rest: what is alive then, and the memory in use, must
// not grow once it has warmed up.
#include <malloc.h>
#include <unistd.h>

#include <array>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <string>
#include <vector>

#include "Data.h"
#include "Input.h"
#include "PlugInRun.h"
#include "Tokens.h"
#include "TranslatorWalk.h"
#include "VRKStringTranslatorClient.h"
#include "VRKTranslationImage.h"

namespace {

constexpr uint32_t kRests = 10;
constexpr uint32_t kWarmUp = 3;
constexpr uint64_t kReloadEvery = 2000;
constexpr size_t kMostGrowth = size_t{64} << 10;
constexpr size_t kMostResidentGrowth = size_t{4} << 20;  // pages that the allocator keeps vary

struct Memory {
  static Memory InUse() {
    const auto heap = mallinfo2();
    size_t total = 0, resident = 0;
    std::ifstream("/proc/self/statm") >> total >> resident;
    return {heap.uordblks + heap.hblkhd, resident * static_cast<size_t>(sysconf(_SC_PAGESIZE))};
  }

  size_t allocated;
  size_t resident;
};

// A translator that some of its keys are loaded into again and again, as text.
class Resident {
 public:
  explicit Resident(Choices& decisions) : choices(decisions), values(kKeys) { Reload(kKeys); }

  void Reload() { Reload(choices.Below(kKeys)); }

 private:
  static constexpr uint32_t kKeys = 1000;

  void Reload(uint32_t count) {
    std::string text = "\xFF\xFE";
    for (uint32_t i = 0; i < count; ++i) {
      const uint32_t key = count == kKeys ? i : choices.Below(kKeys);
      values[key] = "value " + std::to_string(choices.Below(65536));
      text += Widened("\"$$$/key" + std::to_string(key) + "=" + values[key] + "\"\n");
    }
    const auto byteCount = static_cast<uint32_t>(text.size());
    const auto image = Varnel::PackTranslationImage(text.data(), byteCount);
    translator->SetTranslations(image.units.get(), image.unitCount);
    for (int i = 0; i < 10; ++i) Ask(choices.Below(kKeys));
  }

  void Ask(uint32_t key) {
    const std::string text = "$$$/key" + std::to_string(key) + "=default";
    std::vector<uint16_t> units;
    translator->TranslateString(text.data(), static_cast<uint32_t>(text.size()), units);
    units.pop_back();
    Require(std::string(units.begin(), units.end()) == values[key], "what stays answers, too");
  }

  static std::string Widened(const std::string& text) {
    std::string bytes;
    for (const char character : text) bytes += {character, '\0'};
    return bytes;
  }

  Choices& choices;
  std::vector<std::string> values;
  boost::shared_ptr<Varnel::StringTranslatorInterface> translator = Varnel::CreateStringTranslator();
};

uint64_t Total(const TranslatorWalk& walk) {
  uint64_t total = 0;
  for (const auto& [result, count] : walk.Results()) total += count;
  return total;
}

void WalkTo(uint64_t count, TranslatorWalk& walk, Resident& resident) {
  for (uint64_t next = Total(walk); next < count; next += kReloadEvery) {
    while (Total(walk) < next) walk.Step();
    resident.Reload();
  }
  walk.Rest();
}

void Compare(const Memory& now, Memory& most, uint32_t rest) {
  std::fprintf(stderr, "%u: %zu bytes allocated, %zu resident\n", rest, now.allocated, now.resident);
  if (rest < kWarmUp) {
    most = {std::max(most.allocated, now.allocated), std::max(most.resident, now.resident)};
    return;
  }
  Require(now.allocated <= most.allocated + kMostGrowth, "memory does not grow");
  Require(now.resident <= most.resident + kMostResidentGrowth, "nor does the process");
}

void Soak(uint64_t count) {
  const PlugInRun run;
  Choices choices(8);
  Require(VRKHostPlugInInitialize(run.Handle()) == 0, "the plug-in initialises");
  Resident resident(choices);
  TranslatorWalk walk(choices, run.Handle());
  walk.Rest();
  const VRKHostLiveCounts atRest = LiveCounts();
  Memory most{};
  for (uint32_t rest = 0; rest < kRests; ++rest) {
    WalkTo(count * (rest + 1) / kRests, walk, resident);
    const VRKHostLiveCounts now = LiveCounts();
    Require(std::memcmp(&now, &atRest, sizeof now) == 0, "nothing is left over");
    Compare(Memory::InUse(), most, rest);
  }
  for (const auto& [result, number] : walk.Results()) {
    std::fprintf(stderr, "result %u: %llu\n", result, static_cast<unsigned long long>(number));
  }
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) return std::fprintf(stderr, "usage: soak COUNT\n"), 2;
  Soak(std::stoull(argv[1]));
  return 0;
}
