// What serves the messages to a translator object.
#pragma once

#include <boost/shared_ptr.hpp>

#include "MessageHandler.h"
#include "VRKStringTranslatorInterface.h"

namespace Varnel {

// Lives in kernel memory, and holds a share of its translator. Failures of the translator and of
// the kernel become the result of the delivery.
class StringTranslatorHandler : public MessageHandler {
 public:
  // Attached to no object yet.
  explicit StringTranslatorHandler(boost::shared_ptr<StringTranslatorInterface> servingTranslator);

  // Releases the translator, then ends the registration. Messages that arrive meanwhile are not
  // handled.
  ~StringTranslatorHandler() override;

  // Attaches the handler to an object and asks for the three messages of a translator. When asking
  // fails, the handler stays attached.
  void SetObject(VRKObject newObject) override;

  // Attaches the handler, which was made with new, to an object, with which it dies. When it
  // throws, as it does when the object dies meanwhile, the handler is the caller's still.
  void LiveWith(VRKObject newObject);

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
