// kolvane dump: prints a dictionary as text.
#pragma once

#include "Messages.h"

// `argv[0]` is the command's own name. Throws UsageError, CommandLine::HelpPrinted, Failure and
// ClosedPipe.
ExitStatus RunDump(int argc, const char* const* argv);
