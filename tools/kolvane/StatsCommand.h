// kolvane stats: counts what dictionaries hold and how far translations have come.
#pragma once

#include "Messages.h"

// `argv[0]` is the command's own name. Throws UsageError, CommandLine::HelpPrinted, Failure and
// ClosedPipe.
ExitStatus RunStats(int argc, const char* const* argv);
