// kolvane convert: changes the encoding of a text dictionary.
#pragma once

#include "Messages.h"

// `argv[0]` is the command's own name. Throws UsageError, CommandLine::HelpPrinted, Failure and
// ClosedPipe.
ExitStatus RunConvert(int argc, const char* const* argv);
