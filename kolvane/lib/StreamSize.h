// The size of a stream that can seek.
#pragma once

#include <cstdint>
#include <iosfwd>

namespace tovali_private {

// The bytes from the stream's position to its end, where it is left.
uint64_t SkipToEnd(std::istream& stream);

// The bytes from the stream's start, where it is left, to its end. Requires: the stream can seek to
// its start; one that cannot seek to its end is read through.
uint64_t StreamSize(std::istream& stream);

}  // namespace tovali_private
