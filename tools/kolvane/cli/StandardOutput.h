// Standard output whose failures are noticed.
#pragma once

#include <string_view>

// Each operation throws Failure with the system's reason when the output cannot be written, and
// ClosedPipe when nobody reads it any more, of which nothing need be said.
struct ClosedPipe {};

void WriteOutput(std::string_view text);
void FlushOutput();

// No more can be written. Does not tell again of a failure that was thrown before.
void CloseOutput();
