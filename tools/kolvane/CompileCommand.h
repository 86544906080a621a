// kolvane compile: makes a binary image of dictionaries.
#pragma once

#include "Messages.h"

// `argv[0]` is the command's own name. Throws UsageError, CommandLine::HelpPrinted, Failure and
// ClosedPipe.
ExitStatus RunCompile(int argc, const char* const* argv);
