// The comparison of a translation's placeholders with its reference's.
#pragma once

#include <vector>

#include "tools/kolvane/lint/Comparison.h"
#include "tools/kolvane/text/Placeholders.h"

// Names are compared as sets, printf's arguments by number and type. The latter are left alone
// where the reference mixes numbered and unnumbered ones, and where its `%` are plain text: what
// looks like a directive in the translation is plain text then, too, as in Hungarian `50%-os`.
std::vector<Difference> ComparePlaceholders(Placeholders reference, Placeholders translation);
