#include "TokenTable.h"

#define XXH_INLINE_ALL
#include <xxhash.h>

#include "ProcessSeed.h"

namespace varnel_kernel {

size_t TokenTable::Hash::operator()(std::string_view text) const noexcept {
  static const uint64_t seed = platform::ProcessSeed();
  return static_cast<size_t>(XXH3_64bits_withSeed(text.data(), text.size(), seed));
}

VRKToken TokenTable::TokenOf(std::string_view text) {
  if (const auto found = tokens.find(text); found != tokens.end()) return found->second;
  const std::string& kept = texts.emplace_back(text);
  const VRKToken token{static_cast<uint32_t>(texts.size())};
  try {
    tokens.emplace(kept, token);
  } catch (...) {
    texts.pop_back();
    throw;
  }
  return token;
}

bool TokenTable::Holds(VRKToken token) const noexcept {
  const auto number = static_cast<uint32_t>(token);
  return number != 0 && number <= texts.size();
}

const char* TokenTable::TextOf(VRKToken token) const noexcept {
  return Holds(token) ? texts[static_cast<uint32_t>(token) - 1].c_str() : nullptr;
}

}  // namespace varnel_kernel
