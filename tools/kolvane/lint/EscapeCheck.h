// What a translator silently forgives in the escapes and named characters of a value.
#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "tools/kolvane/lint/Finding.h"

struct EscapeFault {
  const Rule* rule;
  size_t at;  // the unit of the value where it begins
  std::string message;
};

// The first of them, at most `most`. Takes a value as a text dictionary writes it. Unpaired
// surrogates are shown replaced.
std::vector<EscapeFault> FaultsOfEscapes(std::span<const uint16_t> value, size_t most);
