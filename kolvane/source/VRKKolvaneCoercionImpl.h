// Turns keys into translated text wherever the kernel coerces data.
#pragma once

#include "DataCoercion.h"
#include "Tokens.h"

namespace Varnel::Kolvanes {

// The types of what is coerced, a key, and of the texts that it is coerced to.
extern StaticToken gTypeLocaleIndependentUTF8;
extern StaticToken gTypeUTF8;
extern StaticToken gTypeUTF16LE;
extern StaticToken gTypeUTF16BE;

// The next use makes them anew.
void ResetTypeTokens() noexcept;

// Lives in kernel memory. Coerces keys to UTF-8 and UTF-16 of either byte order, by having the
// default translator translate them; the text ends in one 0 unit.
class CoercionImpl final : public DataCoercion {
 public:
  // Installs the three coercions; none of them stays installed when it throws.
  CoercionImpl();

  // False where the kernel cannot coerce the translation, which is UTF-16LE, to the type. Throws
  // InputContractViolation for another `fromType` than that of keys, InvariantViolation when the
  // default translator is dead, and what the kernel and the translator throw.
  bool HandleCoercionImpl(const DataRef& source, VRKToken fromType, VRKToken toType,
                          DataRef& result) override;
};

}  // namespace Varnel::Kolvanes
