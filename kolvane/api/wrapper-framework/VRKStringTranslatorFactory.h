// What makes translator objects of a kernel class.
#pragma once

#include <boost/function.hpp>
#include <boost/shared_ptr.hpp>

#include "Names.h"
#include "ObjectFactory.h"
#include "VRKStringTranslatorInterface.h"
#include "Values.h"

namespace Varnel {

// Makes the translator for a new object from the object's creation parameters.
using StringTranslatorCreator =
    boost::function<boost::shared_ptr<StringTranslatorInterface>(orvane::dictionary_t const&)>;

// A base, so that the creator is destroyed only after the factory was unregistered.
struct StringTranslatorCreatorHolder {
  StringTranslatorCreator creator;
};

// Lives in kernel memory. Gives each new object a translator, which its creator makes, and a
// handler that lives as long as the object. Keeps no reference to either.
class StringTranslatorFactory : private StringTranslatorCreatorHolder, public ObjectFactory {
 public:
  using Creator = StringTranslatorCreator;

  // Serves the class from now on. Throws the kernel's failures; std::bad_alloc.
  StringTranslatorFactory(Creator translatorCreator, orvane::name_t servedClass);

  // What it throws, and what the creator throws, becomes the result of the object's creation.
  void InitializeObject(VRKToken objectClass, const DictionaryRef& parameters,
                        const ObjectRef& newObject) override;
};

}  // namespace Varnel
