// Turning data of one type into another.
#pragma once

#include <cstdint>
#include <vector>

#include "Callbacks.h"
#include "HandleTable.h"
#include "TextCoercion.h"
#include "TokenTable.h"
#include "Values.h"
#include "VarnelKernel.h"

namespace varnel_kernel {

struct Coercion {
  VRKToken fromType;
  VRKToken toType;
  Callback<VRKDataCoercionCallback> callback;
  uint64_t number;  // grows from one installation to the next
};

// Data of the type asked for stays as it is; else the handlers installed for the pair are asked,
// latest first, and last the kernel's own coercion between texts. Handles may be any 32 bits; outs
// are not null. Callbacks may install and remove handlers while they run.
class Coercions {
 public:
  Coercions(HandleTable& handleTable, TokenTable& tokenTable, Values& valueStore,
            RunningCode*& innermostCode);

  VRKResult Coerce(VRKData data, VRKToken toType, VRKData& outData);
  VRKResult Install(VRKToken fromType, VRKToken toType, Callback<VRKDataCoercionCallback> callback);
  VRKResult Remove(Callback<VRKDataCoercionCallback> callback) noexcept;

  const std::vector<Coercion>& Installed() const noexcept { return installed; }
  void Clear() noexcept { installed.clear(); }

 private:
  VRKResult Convert(VRKData data, VRKToken fromType, VRKToken toType, VRKData& outData);
  const Coercion* LatestBefore(uint64_t number, VRKToken fromType, VRKToken toType) const noexcept;
  VRKResult CoerceThrough(Callback<VRKDataCoercionCallback> callback, VRKData data,
                          VRKToken fromType, VRKToken toType, VRKData& outData);

  HandleTable& handles;
  TokenTable& tokens;
  Values& values;
  RunningCode*& running;
  TextCoercion texts;
  std::vector<Coercion> installed;  // in the order of installation
  uint64_t nextNumber = 0;
};

}  // namespace varnel_kernel
