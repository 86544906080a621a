// The base class of object factories.
#pragma once

#include <cstdint>

#include "wrapper-framework/source/KernelRefs.h"
#include "wrapper-framework/source/Memory.h"
#include "wrapper-framework/source/VarnelKernel.h"

namespace Varnel {

class ObjectFactory : public Memory<KernelMemoryPolicy> {
 public:
  // Not registered. New objects are created with class `base`, or as plain ones if it is null.
  explicit ObjectFactory(VRKToken base = {}) noexcept : baseClass(base) {}
  ObjectFactory(const ObjectFactory&) = delete;
  ObjectFactory& operator=(const ObjectFactory&) = delete;

  // Unregisters the factory. Objects that it created stay. The kernel may call the factory until
  // then, after the members of derived classes are destroyed; state that InitializeObject uses
  // belongs into a base class declared before this one.
  virtual ~ObjectFactory();

  // Attaches handlers to a new object of the requested class. An exception fails the creation and
  // releases the object. May delete the factory.
  virtual void InitializeObject(VRKToken objectClass, const DictionaryRef& parameters,
                                const ObjectRef& newObject) = 0;

  // Registers the factory for a class. `reserved` is 0. Throws: Exception with the kernel's code.
  void Register(VRKToken objectClass, uint32_t reserved);

  // Creates an object of the base class, stores it, owned by the caller, and initialises it. May
  // have stored an object when it throws.
  void CreateObject(VRKToken objectClass, VRKDictionary parameters, VRKObject* outObject);

 protected:
  VRKToken baseClass;

 private:
  static VRKResult VRK_CALL Callback(VRKToken objectClass, VRKDictionary parameters, void* context,
                                     VRKObject* outObject);
};

}  // namespace Varnel
