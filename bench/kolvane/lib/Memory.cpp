#include "bench/kolvane/lib/Memory.h"

#include <malloc.h>

#include <fstream>
#include <stdexcept>
#include <string>

namespace {

double ReadStatus(const std::string& field) {
  std::ifstream status("/proc/self/status");
  for (std::string word; status >> word;) {
    double kibibytes = 0;
    if (word == field && status >> kibibytes) return kibibytes * 1024;
  }
  throw std::runtime_error("no " + field + " in /proc/self/status");
}

void ResetPeak() {
  std::ofstream clear("/proc/self/clear_refs");
  if (!(clear << "5" << std::flush)) throw std::runtime_error("the peak cannot be reset");
}

}  // namespace

void TrimMemory() {
  malloc_trim(0);
}

PeakMeter::PeakMeter() {
  TrimMemory();
  ResetPeak();
  before = ReadStatus("VmRSS:");
}

double PeakMeter::PeakBytes() const {
  return ReadStatus("VmHWM:") - before;
}
