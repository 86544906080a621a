// Stops in a debugger that is not there.
#pragma once

#include <functional>

// How often `run` stopped; it goes on after each stop.
int BreaksOf(const std::function<void()>& run);
