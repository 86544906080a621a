// The factory of translator objects of a kernel class.
#pragma once

#include <boost/function.hpp>
#include <boost/shared_ptr.hpp>

#include "kolvane/api/VRKStringTranslatorInterface.h"
#include "wrapper-framework/source/Names.h"
#include "wrapper-framework/source/ObjectFactory.h"
#include "wrapper-framework/source/Values.h"

namespace Varnel {

// Returns the translator of a new object, given the object's creation parameters.
using StringTranslatorCreator =
    boost::function<boost::shared_ptr<StringTranslatorInterface>(orvane::dictionary_t const&)>;

// A base class, so that the creator is destroyed after the factory is unregistered.
struct StringTranslatorCreatorHolder {
  StringTranslatorCreator creator;
};

// Attaches to each new object a handler that lives as long as the object and shares the translator
// that the creator returns. The factory keeps no reference to either. Allocated in kernel memory.
class StringTranslatorFactory : private StringTranslatorCreatorHolder, public ObjectFactory {
 public:
  using Creator = StringTranslatorCreator;

  // Registers the factory for the class. Throws: Exception with the kernel's code, std::bad_alloc.
  StringTranslatorFactory(Creator translatorCreator, orvane::name_t servedClass);

  // Exceptions, also the creator's, become the result of the object's creation.
  void InitializeObject(VRKToken objectClass, const DictionaryRef& parameters,
                        const ObjectRef& newObject) override;
};

}  // namespace Varnel
