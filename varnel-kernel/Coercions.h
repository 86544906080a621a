// Coercion of data from one type to another.
#pragma once

#include <cstdint>
#include <vector>

#include "varnel-kernel/Callbacks.h"
#include "varnel-kernel/HandleTable.h"
#include "varnel-kernel/TextCoercion.h"
#include "varnel-kernel/TokenTable.h"
#include "varnel-kernel/Values.h"
#include "wrapper-framework/source/VarnelKernel.h"

namespace varnel_kernel {

struct Coercion {
  VRKToken fromType;
  VRKToken toType;
  Callback<VRKDataCoercionCallback> callback;
  uint64_t number;  // increases with each installation
};

// Data that already has the target type is returned as it is. Otherwise the handlers installed for
// the pair of types are tried, latest first, then the built-in coercion between text types.
//
// Handles may be any 32 bits. Callbacks may install and remove handlers while they run.
// Requires: outs are not null.
class Coercions {
 public:
  Coercions(HandleTable& handleTable, TokenTable& tokenTable, Values& valueStore,
            ActiveCallback*& innermostCode);

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
  ActiveCallback*& running;
  TextCoercion texts;
  std::vector<Coercion> installed;  // in the order of installation
  uint64_t nextNumber = 0;
};

}  // namespace varnel_kernel
