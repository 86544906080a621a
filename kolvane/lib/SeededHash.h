// For hash tables of texts from outside: std::hash is the same in every process, and texts that
// collide in it are easy to make.
#pragma once

#include <cstddef>
#include <string_view>

namespace tovali_private {

struct SeededHash {
  size_t operator()(std::string_view text) const noexcept;
};

}  // namespace tovali_private
