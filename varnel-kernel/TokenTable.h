// The kernel's tokens: texts as small integers.
#pragma once

#include <boost/unordered/unordered_flat_map.hpp>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <string>
#include <string_view>

#include "VarnelKernel.h"

namespace varnel_kernel {

// Keeps every text it has seen, so that tokens and their texts stay valid for the table's life.
// Finding a text that is there already allocates nothing.
class TokenTable {
 public:
  // Throws std::bad_alloc; the table is then as it was.
  VRKToken TokenOf(std::string_view text);

  bool Holds(VRKToken token) const noexcept;

  // Null for what is no token of this table.
  const char* TextOf(VRKToken token) const noexcept;

 private:
  // Tokens are asked for by their texts over and over again.
  struct Hash {
    using is_avalanching = void;
    size_t operator()(std::string_view text) const noexcept;
  };

  std::deque<std::string> texts;  // that of token n at n - 1
  boost::unordered_flat_map<std::string_view, VRKToken, Hash> tokens;
};

}  // namespace varnel_kernel
