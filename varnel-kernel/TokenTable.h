// The kernel's tokens: texts as small integers.
#pragma once

#include <boost/unordered/unordered_flat_map.hpp>
#include <deque>
#include <string>
#include <string_view>

#include "SeededHash.h"
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
  std::deque<std::string> texts;  // that of token n at n - 1
  boost::unordered_flat_map<std::string_view, VRKToken, platform::SeededHash> tokens;
};

}  // namespace varnel_kernel
