#include "ObjectFactory.h"

#include <utility>

#include "Boundary.h"
#include "Exceptions.h"
#include "Farewell.h"
#include "ResultCodes.h"

namespace Varnel {
namespace {

// An object on its way to the kernel; it dies where the way ends early.
struct ObjectInTheMaking {
  ObjectInTheMaking() = default;
  ObjectInTheMaking(const ObjectInTheMaking&) = delete;
  ObjectInTheMaking& operator=(const ObjectInTheMaking&) = delete;
  ~ObjectInTheMaking() {
    if (object != VRKObject{}) VRKObjectRelease(object);
  }

  VRKObject object{};
};

}  // namespace

ObjectFactory::~ObjectFactory() {
  const Farewell farewell(this);
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
    if (Farewell::IsSaidBy(context)) throw InvariantViolation();
    ObjectInTheMaking making;
    static_cast<ObjectFactory*>(context)->CreateObject(objectClass, parameters, &making.object);
    if (making.object == VRKObject{}) throw OutputContractViolation();
    *outObject = std::exchange(making.object, VRKObject{});
    return kResultNoError;
  });
}

}  // namespace Varnel
