#include "varnel-kernel/TokenTable.h"

namespace varnel_kernel {

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
