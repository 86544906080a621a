// What translations lack, or have too much, beside the texts that they translate.
#pragma once

#include <string>
#include <vector>

#include "tools/kolvane/lint/Definitions.h"
#include "tools/kolvane/lint/Finding.h"

// Compares the definitions of `file` with those of a reference, and the file's accelerators with
// each other; those of the reference excuse a clash that they have themselves. `reference` may be
// null.
void CheckTranslations(const std::string& file, const Definitions& translations,
                       const Definitions* reference, std::vector<Finding>& findings);
