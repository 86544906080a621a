// Whether what is printed has colours.
#pragma once

#include "tools/kolvane/cli/CommandLine.h"

enum class ColourChoice { kAuto, kAlways, kNever };

// What the user chose; else what the environment says in NO_COLOR, then in CLICOLOR_FORCE; else
// whether standard output is a terminal that shows colours.
bool WantsColour(ColourChoice choice);

// Adds `--color`; `choice` outlives the parsing.
void AddColourOption(CommandLine& commandLine, ColourChoice& choice);
