// The message handler of translator objects.
#pragma once

#include <boost/shared_ptr.hpp>

#include "kolvane/api/VRKStringTranslatorInterface.h"
#include "wrapper-framework/source/MessageHandler.h"

namespace Varnel {

// Turns the three messages of VRKStringTranslatorProtocol.h into calls on a translator, whose
// ownership it shares. Failures of the translator and the kernel become the result of the delivery.
// Allocated in kernel memory.
class StringTranslatorHandler : public MessageHandler {
 public:
  // Not attached to an object.
  explicit StringTranslatorHandler(boost::shared_ptr<StringTranslatorInterface> servingTranslator);

  // Releases the translator, then ends the registration. Messages that arrive meanwhile are not
  // handled.
  ~StringTranslatorHandler() override;

  // Attaches the handler to an object and adds the three messages. If adding fails, the handler
  // stays attached.
  void SetObject(VRKObject newObject) override;

  // Attaches the handler to an object and gives the object ownership of it. If this throws, also
  // because the object died meanwhile, the caller keeps ownership. Requires: allocated with new.
  void AttachAndOwn(VRKObject newObject);

  void ObjectDied() override;
  bool HandleMessage(VRKObject receiver, VRKToken message,
                     const DictionaryRef& parameters) override;

  void HandleSetTranslations(const DictionaryRef& parameters);
  void HandleTranslateString(const DictionaryRef& parameters);

 private:
  boost::shared_ptr<StringTranslatorInterface> translator;
  bool ownsItself = false;
};

}  // namespace Varnel
