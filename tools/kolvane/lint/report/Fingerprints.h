// What a finding is known by from one run to the next.
#pragma once

#include <span>
#include <string>
#include <vector>

#include "tools/kolvane/lint/Finding.h"

// One for each finding: a hash, in hexadecimal, of its rule, key and file and of how many findings
// before it have the same three. It outlives line numbers, and is the same on every machine.
std::vector<std::string> Fingerprints(std::span<const Finding> findings);
