#include "SeededHash.h"

#define XXH_INLINE_ALL
#include <xxhash.h>

#include "ProcessSeed.h"

namespace tovali_private {

size_t SeededHash::operator()(std::string_view text) const noexcept {
  static const uint64_t seed = platform::ProcessSeed();
  return static_cast<size_t>(XXH3_64bits_withSeed(text.data(), text.size(), seed));
}

}  // namespace tovali_private
