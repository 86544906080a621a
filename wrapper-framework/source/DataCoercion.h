// The base of what coerces kernel data of one type into another.
#pragma once

#include "Holders.h"
#include "Memory.h"
#include "VarnelKernel.h"

namespace Varnel {

class DataCoercion : public Memory<KernelMemoryPolicy> {
 public:
  DataCoercion() noexcept = default;  // installed for no types yet
  DataCoercion(const DataCoercion&) = delete;
  DataCoercion& operator=(const DataCoercion&) = delete;

  // Ends all installations.
  virtual ~DataCoercion();

  // Puts the source, as data of the other type, into `result`; or returns false where that is
  // impossible. Throws when it fails. May delete the coercion.
  virtual bool HandleCoercionImpl(const DataRef& source, VRKToken fromType, VRKToken toType,
                                  DataRef& result) = 0;

  // The kernel asks this object, besides the pairs of types that it was installed for before, from
  // now on for this one too. A null type is an InputContractViolation.
  void Install(VRKToken fromType, VRKToken toType);

  // Stores data that is owned by the caller and returns true, or returns false. A null out is an
  // InputContractViolation.
  bool HandleCoercion(VRKData source, VRKToken fromType, VRKToken toType, VRKData* outData);

 private:
  static VRKResult VRK_CALL Callback(VRKData source, VRKToken fromType, VRKToken toType,
                                     void* context, VRKData* outData);
};

}  // namespace Varnel
