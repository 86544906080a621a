#include "HeldBytes.h"

#include <algorithm>
#include <istream>
#include <limits>
#include <streambuf>

namespace tovali_private {
namespace {

// Where a buffer keeps what it has in memory is for classes derived from it to know.
struct GetArea : std::streambuf {
  static std::span<const uint8_t> Of(const std::streambuf& buffer) noexcept {
    const char* const next = (buffer.*&GetArea::gptr)();
    const char* const end = (buffer.*&GetArea::egptr)();
    return {reinterpret_cast<const uint8_t*>(next), static_cast<size_t>(end - next)};
  }

  static void Skip(std::streambuf& buffer, int count) noexcept { (buffer.*&GetArea::gbump)(count); }
};

}  // namespace

std::span<const uint8_t> HeldBytes(std::istream& stream) {
  if (!stream.good()) return {};
  const auto held = GetArea::Of(*stream.rdbuf());
  if (!held.empty()) return held;
  stream.peek();
  return stream.good() ? GetArea::Of(*stream.rdbuf()) : held;
}

void SkipHeld(std::istream& stream, size_t count) noexcept {
  constexpr size_t kMost = std::numeric_limits<int>::max();
  while (count != 0) {
    const size_t step = std::min(count, kMost);
    GetArea::Skip(*stream.rdbuf(), static_cast<int>(step));
    count -= step;
  }
}

}  // namespace tovali_private
