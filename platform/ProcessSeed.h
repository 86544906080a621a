// What makes hashes of this process unlike those of any other, so that no input can be made to
// collide in them.
#pragma once

#include <cstdint>

namespace platform {

// Random, and the same from one call to the next. Where the system has no random numbers, it is
// what the time and the place of the process's memory make it.
uint64_t ProcessSeed() noexcept;

}  // namespace platform
