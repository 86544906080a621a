// The commands. Each runs with the arguments after its name, and throws Failure or UsageError.
#pragma once

#include "tools/kolvane/cli/Diagnostics.h"

ExitStatus RunCheck(int argc, const char* const* argv);
ExitStatus RunCompile(int argc, const char* const* argv);
ExitStatus RunConvert(int argc, const char* const* argv);
ExitStatus RunDump(int argc, const char* const* argv);
ExitStatus RunStats(int argc, const char* const* argv);
ExitStatus RunTranslate(int argc, const char* const* argv);
