#include "wrapper-framework/source/DataCoercion.h"

#include "wrapper-framework/source/Boundary.h"
#include "wrapper-framework/source/DestructionScope.h"
#include "wrapper-framework/source/Exceptions.h"
#include "wrapper-framework/source/ResultCodes.h"

namespace Varnel {

DataCoercion::~DataCoercion() {
  const DestructionScope destruction(this);
  VRKDataCoercionHandlerRemove(&Callback, this, 0, 0);
}

void DataCoercion::Install(VRKToken fromType, VRKToken toType) {
  if (fromType == VRKToken{} || toType == VRKToken{}) throw InputContractViolation();
  ThrowIfFailed(VRKDataCoercionHandlerInstall(fromType, toType, 0, &Callback, this));
}

bool DataCoercion::HandleCoercion(VRKData source, VRKToken fromType, VRKToken toType,
                                  VRKData* outData) {
  if (outData == nullptr) throw InputContractViolation();
  const DataRef heldSource(source);
  DataRef result;
  if (!HandleCoercionImpl(heldSource, fromType, toType, result)) return false;
  *outData = result.Detach();
  return true;
}

VRKResult VRK_CALL DataCoercion::Callback(VRKData source, VRKToken fromType, VRKToken toType,
                                          void* context, VRKData* outData) {
  if (DestructionScope::IsDestroying(context)) return kResultCannotCoerce;
  return AtBoundary({}, [&] {
    DataCoercion& coercion = *static_cast<DataCoercion*>(context);
    const bool coerced = coercion.HandleCoercion(source, fromType, toType, outData);
    return coerced ? kResultNoError : kResultCannotCoerce;
  });
}

}  // namespace Varnel
