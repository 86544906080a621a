// The bytes of a stream where they lie in memory, instead of one after the other through its calls.
#pragma once

#include <cstddef>
#include <cstdint>
#include <iosfwd>
#include <span>

namespace tovali_private {

// What the stream has in memory of what is to be read next, after it has been made to fetch more if
// that was nothing. Nothing at the stream's end and after a failure, and for a stream that keeps
// nothing in memory, whose bytes must be got one at a time.
std::span<const uint8_t> HeldBytes(std::istream& stream);

// Takes the first bytes of those that are held, as if they had been got one at a time.
void SkipHeld(std::istream& stream, size_t count) noexcept;

}  // namespace tovali_private
