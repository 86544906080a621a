// kolvane translate: translates keys with the dictionaries it is given.
#pragma once

#include "Messages.h"

// `argv[0]` is the command's own name. Throws UsageError, CommandLine::HelpPrinted, Failure and
// ClosedPipe.
ExitStatus RunTranslate(int argc, const char* const* argv);
