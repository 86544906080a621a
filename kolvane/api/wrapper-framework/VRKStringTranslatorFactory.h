// What makes translator objects of a kernel class.
#pragma once

#include <boost/function.hpp>
#include <boost/shared_ptr.hpp>

#include "Names.h"
#include "ObjectFactory.h"
#include "VRKStringTranslatorInterface.h"
#include "Values.h"

namespace Varnel {

// Lives in kernel memory. Gives each new object a handler that lives with it, and the translator
// that its creator makes of the object's creation parameters. Knows neither of them afterwards.
class StringTranslatorFactory : public ObjectFactory {
 public:
  using Creator =
      boost::function<boost::shared_ptr<StringTranslatorInterface>(orvane::dictionary_t const&)>;

  // Serves the class from now on. Throws the kernel's failures; std::bad_alloc.
  StringTranslatorFactory(Creator translatorCreator, orvane::name_t servedClass);

  // What it throws, and what the creator throws, becomes the result of the object's creation.
  void InitializeObject(VRKToken objectClass, const DictionaryRef& parameters,
                        const ObjectRef& newObject) override;

 private:
  Creator creator;
};

}  // namespace Varnel
