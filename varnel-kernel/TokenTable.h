// Interned texts: each distinct text has a token, a small integer.
#pragma once

#include <boost/unordered/unordered_flat_map.hpp>
#include <deque>
#include <string>
#include <string_view>

#include "platform/SeededHash.h"
#include "wrapper-framework/source/VarnelKernel.h"

namespace varnel_kernel {

// Never forgets a text, so tokens and texts are valid as long as the table. Looking up a known text
// allocates nothing.
class TokenTable {
 public:
  // Adds the text if it is new. Throws: std::bad_alloc; the table is then unchanged.
  VRKToken TokenOf(std::string_view text);

  bool Holds(VRKToken token) const noexcept;

  // Returns null if this table has no such token.
  const char* TextOf(VRKToken token) const noexcept;

 private:
  std::deque<std::string> texts;  // that of token n at n - 1
  boost::unordered_flat_map<std::string_view, VRKToken, platform::SeededHash> tokens;
};

}  // namespace varnel_kernel
