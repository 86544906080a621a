#include "kolvane/api/wrapper-framework/VRKStringTranslatorFactory.h"

#include <memory>
#include <utility>

#include "kolvane/api/wrapper-framework/VRKStringTranslatorHandler.h"
#include "wrapper-framework/source/Conversion.h"
#include "wrapper-framework/source/Tokens.h"

namespace Varnel {

StringTranslatorFactory::StringTranslatorFactory(Creator translatorCreator,
                                                 orvane::name_t servedClass)
    : StringTranslatorCreatorHolder{std::move(translatorCreator)} {
  Register(MakeToken(servedClass), 0);
}

void StringTranslatorFactory::InitializeObject(VRKToken, const DictionaryRef& parameters,
                                               const ObjectRef& newObject) {
  const Creator kept = creator;  // AsDictionary calls coercions, which may destroy the factory
  const boost::shared_ptr<StringTranslatorInterface> translator = kept(AsDictionary(parameters));
  auto handler = std::make_unique<StringTranslatorHandler>(translator);
  handler->AttachAndOwn(newObject.Get());
  static_cast<void>(handler.release());  // owned by the object
}

}  // namespace Varnel
