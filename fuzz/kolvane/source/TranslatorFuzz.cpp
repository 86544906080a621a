// Any bytes as the decisions of a walk over translator objects.
#include "Input.h"
#include "PlugInRun.h"
#include "TranslatorWalk.h"

int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const PlugInRun run;
  Choices choices(data, size);
  TranslatorWalk walk(choices, run.Handle());
  while (!choices.AtEnd()) walk.Step();
  walk.Rest();
  return 0;
}
