// `soak COUNT` delivers that many messages and coercions, or a few more, to translators that come
// and go in one process, compares every answer with the model's, and reloads one translator that
// stays over and over. Ten times it comes to rest: what is alive then, and the memory in use, must
// not grow once it has warmed up.
#include <malloc.h>
#include <unistd.h>

#include <cstdio>
#include <fstream>

#include "fuzz/kolvane/source/PlugInRun.h"
#include "fuzz/kolvane/source/TranslatorWalk.h"
#include "kolvane/api/wrapper-framework/VRKStringTranslatorClient.h"

namespace {

constexpr uint32_t kRests = 10;
constexpr uint32_t kWarmUp = 3;
constexpr uint64_t kReloadEvery = 2000;
constexpr size_t kMostGrowth = size_t{1} << 20;          // of which a dictionary that is reloaded takes its share
constexpr size_t kMostResidentGrowth = size_t{4} << 20;  // pages that the allocator keeps vary

// A translator that some of its keys are loaded into again and again, as text.
class Resident {
 public:
  explicit Resident(Choices& decisions) : choices(decisions), values(kKeys, "default") {}

  void Reload() {
    std::string text = "// some of them\n";
    for (uint32_t i = choices.Below(kKeys); i > 0; --i) {
      const uint32_t key = choices.Below(kKeys);
      values[key] = "value " + std::to_string(choices.Below(65536));
      text += "\"$$$/key" + std::to_string(key) + "=" + values[key] + "\"\n";
    }
    Load(*translator, AsUTF16(text));
    for (int i = 0; i < 10; ++i) {
      const uint32_t key = choices.Below(kKeys);
      const std::string answer = Translated(*translator, "$$$/key" + std::to_string(key) + "=default");
      Require(answer.c_str() == values[key], "what stays answers, too");
    }
  }

 private:
  static constexpr uint32_t kKeys = 1000;

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

// Compares the memory in use with the most that there was while it warmed up.
void CompareMemory(uint32_t rest) {
  static size_t most = 0, mostResident = 0;
  const auto heap = mallinfo2();
  const size_t allocated = heap.uordblks + heap.hblkhd;
  size_t pages = 0, residentPages = 0;
  std::ifstream("/proc/self/statm") >> pages >> residentPages;
  const size_t resident = residentPages * static_cast<size_t>(sysconf(_SC_PAGESIZE));
  std::fprintf(stderr, "%u: %zu bytes allocated, %zu resident\n", rest, allocated, resident);
  if (rest < kWarmUp) {
    most = std::max(most, allocated);
    mostResident = std::max(mostResident, resident);
  }
  Require(allocated <= most + kMostGrowth, "memory does not grow");
  Require(resident <= mostResident + kMostResidentGrowth, "nor does the process");
}

void Soak(uint64_t count) {
  const PlugInRun run;
  Choices choices(8);
  Require(VRKHostPlugInInitialize(run.Handle()) == 0, "the plug-in initialises");
  Resident resident(choices);
  TranslatorWalk walk(choices, run.Handle());
  walk.Rest();
  const VRKHostLiveCounts atRest = LiveCounts();
  for (uint32_t rest = 0; rest < kRests; ++rest) {
    WalkTo(count * (rest + 1) / kRests, walk, resident);
    const VRKHostLiveCounts now = LiveCounts();
    Require(std::memcmp(&now, &atRest, sizeof now) == 0, "nothing is left over");
    CompareMemory(rest);
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
