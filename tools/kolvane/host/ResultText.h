// The kernel's result codes as users see them.
#pragma once

#include <cstdint>
#include <string>

// The code and, if it has one, its name: "result 15 (kResultInvariantViolation)".
std::string ResultText(uint32_t code);
