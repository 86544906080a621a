// The coercion of keys into translated text.
#pragma once

#include "wrapper-framework/source/DataCoercion.h"
#include "wrapper-framework/source/Tokens.h"

namespace Varnel::Kolvanes {

// The type of keys, and the types of text that they are coerced to.
extern StaticToken gTypeLocaleIndependentUTF8;
extern StaticToken gTypeUTF8;
extern StaticToken gTypeUTF16LE;
extern StaticToken gTypeUTF16BE;

// Clears the four tokens, which are created again on their next use.
void ResetTypeTokens() noexcept;

// Coerces keys to UTF-8, UTF-16LE and UTF-16BE: the default translator's translation, followed by
// one 0 unit. Allocated in kernel memory.
class CoercionImpl final : public DataCoercion {
 public:
  // Installs the three coercions. Removes them if it throws.
  CoercionImpl();

  // Returns false if the kernel cannot coerce the translation, UTF-16LE data, to the target type.
  // Throws: InputContractViolation if `fromType` is not the type of keys, InvariantViolation if
  // there is no default translator, and exceptions of the kernel and the translator.
  bool HandleCoercionImpl(const DataRef& source, VRKToken fromType, VRKToken toType,
                          DataRef& result) override;
};

}  // namespace Varnel::Kolvanes
