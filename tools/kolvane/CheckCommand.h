// kolvane check: tells what is wrong with the dictionaries it is given.
#pragma once

#include "Messages.h"

// `argv[0]` is the command's own name. Throws UsageError, CommandLine::HelpPrinted, Failure and
// ClosedPipe.
ExitStatus RunCheck(int argc, const char* const* argv);
