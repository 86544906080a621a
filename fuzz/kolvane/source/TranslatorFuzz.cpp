// Any bytes as the decisions of a walk over translator objects.
#include "fuzz/Input.h"
#include "fuzz/kolvane/source/PlugInRun.h"
#include "fuzz/kolvane/source/TranslatorWalk.h"

int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const PlugInRun run;
  Choices choices(data, size);
  TranslatorWalk walk(choices, run.Handle());
  while (!choices.AtEnd()) walk.Step();
  walk.Rest();
  return 0;
}
