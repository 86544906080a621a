// The base of what makes the objects of a kernel class.
#pragma once

#include <cstdint>

#include "Holders.h"
#include "Memory.h"
#include "VarnelKernel.h"

namespace Varnel {

class ObjectFactory : public Memory<KernelMemoryPolicy> {
 public:
  // Serves no class yet. The objects that the factory extends are of class `base`, or plain ones.
  explicit ObjectFactory(VRKToken base = {}) noexcept : baseClass(base) {}
  ObjectFactory(const ObjectFactory&) = delete;
  ObjectFactory& operator=(const ObjectFactory&) = delete;

  // Unregisters the factory. Objects that it made stay.
  virtual ~ObjectFactory();

  // Attaches to a new object what makes it one of the class that was asked for. When it throws, the
  // object is released and its creation fails. May delete the factory.
  virtual void InitializeObject(VRKToken objectClass, const DictionaryRef& parameters,
                                const ObjectRef& newObject) = 0;

  // The kernel has the factory make the objects of this class from now on. `reserved` is 0.
  void Register(VRKToken objectClass, uint32_t reserved);

  // Makes an object of the base class, stores it, owned by the caller, and initialises it. When it
  // throws, an object may be stored all the same.
  void CreateObject(VRKToken objectClass, VRKDictionary parameters, VRKObject* outObject);

 protected:
  VRKToken baseClass;

 private:
  static VRKResult VRK_CALL Callback(VRKToken objectClass, VRKDictionary parameters, void* context,
                                     VRKObject* outObject);
};

}  // namespace Varnel
