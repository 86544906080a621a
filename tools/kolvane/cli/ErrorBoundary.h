// The end of every run of a command.
#pragma once

#include <functional>
#include <string_view>

#include "tools/kolvane/cli/Diagnostics.h"

// Returns the action's status. Whatever it throws ends here, as a message and a status; a message
// about its command line begins with the command's name, which is empty for `kolvane` itself.
ExitStatus Guard(std::string_view command, const std::function<ExitStatus()>& action);
