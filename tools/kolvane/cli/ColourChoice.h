// Whether what is printed has colours.
#pragma once

enum class ColourChoice { kAuto, kAlways, kNever };

// What the user chose; else what the environment says in NO_COLOR, then in CLICOLOR_FORCE; else
// whether standard output is a terminal that shows colours.
bool WantsColour(ColourChoice choice);
