#include <csignal>

#include "tests/platform/Breaks.h"

namespace {

volatile std::sig_atomic_t gBreaks = 0;

}  // namespace

int BreaksOf(const std::function<void()>& run) {
  gBreaks = 0;
  const auto before = std::signal(SIGTRAP, [](int) { gBreaks = gBreaks + 1; });
  run();
  std::signal(SIGTRAP, before);
  return gBreaks;
}
