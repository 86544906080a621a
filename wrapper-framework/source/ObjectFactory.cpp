#include "wrapper-framework/source/ObjectFactory.h"

#include <utility>

#include "wrapper-framework/source/Boundary.h"
#include "wrapper-framework/source/DestructionScope.h"
#include "wrapper-framework/source/Exceptions.h"
#include "wrapper-framework/source/ResultCodes.h"

namespace Varnel {
namespace {

// Releases the object unless it is handed over to the kernel.
struct ScopedObject {
  ScopedObject() = default;
  ScopedObject(const ScopedObject&) = delete;
  ScopedObject& operator=(const ScopedObject&) = delete;
  ~ScopedObject() {
    if (object != VRKObject{}) VRKObjectRelease(object);
  }

  VRKObject object{};
};

}  // namespace

ObjectFactory::~ObjectFactory() {
  const DestructionScope destruction(this);
  VRKObjectFactoryUnregister(0, &Callback, this);
}

void ObjectFactory::Register(VRKToken objectClass, uint32_t reserved) {
  ThrowIfFailed(VRKObjectFactoryRegister(objectClass, reserved, &Callback, this));
}

void ObjectFactory::CreateObject(VRKToken objectClass, VRKDictionary parameters,
                                 VRKObject* outObject) {
  ThrowIfFailed(VRKObjectCreate(baseClass, parameters, outObject));
  if (*outObject == VRKObject{}) throw OutputContractViolation();
  const DictionaryRef heldParameters(parameters);
  const ObjectRef heldObject(*outObject);
  InitializeObject(objectClass, heldParameters, heldObject);
}

VRKResult VRK_CALL ObjectFactory::Callback(VRKToken objectClass, VRKDictionary parameters,
                                           void* context, VRKObject* outObject) {
  return AtBoundary({}, [&] {
    if (context == nullptr || outObject == nullptr) throw InputContractViolation();
    if (DestructionScope::IsDestroying(context)) throw InvariantViolation();
    ScopedObject making;
    static_cast<ObjectFactory*>(context)->CreateObject(objectClass, parameters, &making.object);
    if (making.object == VRKObject{}) throw OutputContractViolation();
    *outObject = std::exchange(making.object, VRKObject{});
    return kResultNoError;
  });
}

}  // namespace Varnel
