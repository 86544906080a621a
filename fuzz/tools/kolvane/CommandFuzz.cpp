// Any bytes as the files of `kolvane check`, `compile`, `convert`, `dump` and `stats`.
#include <algorithm>
#include <array>

#include "CommandTrial.h"
#include "Input.h"

// The first bytes choose the command and its options; then come files.
int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  constexpr size_t kChoices = 6;
  constexpr std::array kTries = {TryCheck, TryCompile, TryConvert, TryDump, TryStats};
  const size_t head = std::min(size, kChoices);
  Trial trial(data, head, Pieces(data + head, size - head));
  kTries[trial.choices.Below(kTries.size())](trial);
  return 0;
}
