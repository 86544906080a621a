// The base class of data coercions.
#pragma once

#include "wrapper-framework/source/KernelRefs.h"
#include "wrapper-framework/source/Memory.h"
#include "wrapper-framework/source/VarnelKernel.h"

namespace Varnel {

class DataCoercion : public Memory<KernelMemoryPolicy> {
 public:
  DataCoercion() noexcept = default;  // not installed
  DataCoercion(const DataCoercion&) = delete;
  DataCoercion& operator=(const DataCoercion&) = delete;

  // Removes all installations.
  virtual ~DataCoercion();

  // Stores the coerced data in `result` and returns true, or returns false if the coercion is
  // impossible. An exception becomes the result code. May delete the coercion.
  virtual bool HandleCoercionImpl(const DataRef& source, VRKToken fromType, VRKToken toType,
                                  DataRef& result) = 0;

  // Installs the coercion for a pair of types, in addition to earlier ones. Throws:
  // InputContractViolation for a null type, Exception for the kernel's failures.
  void Install(VRKToken fromType, VRKToken toType);

  // Stores data owned by the caller and returns true, or returns false. Throws:
  // InputContractViolation for a null out, and what HandleCoercionImpl throws.
  bool HandleCoercion(VRKData source, VRKToken fromType, VRKToken toType, VRKData* outData);

 private:
  static VRKResult VRK_CALL Callback(VRKData source, VRKToken fromType, VRKToken toType,
                                     void* context, VRKData* outData);
};

}  // namespace Varnel
