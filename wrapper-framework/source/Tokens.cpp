#include "wrapper-framework/source/Tokens.h"

#include "wrapper-framework/source/Exceptions.h"

namespace Varnel {

constinit StaticToken gTypeUTF8{kTypeUTF8};
constinit StaticToken gTypeUTF16{kTypeUTF16};

VRKToken MakeToken(const char* text) {
  VRKToken token{};
  ThrowIfFailed(VRKTokenCreate(text, 0, &token));
  return token;
}

VRKToken MakeToken(orvane::name_t name) {
  return MakeToken(name.text());
}

orvane::name_t TokenName(VRKToken token) {
  return orvane::name_t(VRKTokenGetString(token));
}

VRKToken StaticToken::Get() {
  if (token == VRKToken{}) ThrowIfFailed(VRKTokenCreate(text, 1, &token));
  if (token == VRKToken{}) throw OutputContractViolation();
  return token;
}

}  // namespace Varnel
