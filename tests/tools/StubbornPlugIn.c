/* A plug-in that has one answer to every key, and that fails at the step which the environment
 * variable STUBBORN names: an entry point, an object's creation or a message, by the end of its name.
 */
#include <stdlib.h>
#include <string.h>

#include "VRKKolvanes.h"

static VRKResult Step(const char* name) {
  const char* const chosen = getenv("STUBBORN");
  const size_t length = chosen != NULL ? strlen(chosen) : 0;
  if (length == 0 || strlen(name) < length) return 0;
  return strcmp(name + strlen(name) - length, chosen) == 0 ? 15 : 0;
}

static VRKToken Token(const char* text) {
  VRKToken token = 0;
  VRKTokenCreate(text, 1, &token);
  return token;
}

static VRKResult VRK_CALL Handle(VRKObject receiver, VRKToken message, VRKDictionary parameters, void* context) {
  static const uint16_t answer[] = {'n', 'o', 0};
  VRKData data = 0;
  (void)receiver;
  (void)context;
  VRKDataCreate(Token("type:orvane.vrk.utf16le"), answer, sizeof answer, 0, &data);
  if (message == Token("message:orvane.localizable-strings.translate-string")) {
    VRKDictionarySetEntry(parameters, Token("parameter:orvane.vrk.message-result"), data);
  }
  VRKDataRelease(data);
  return Step(VRKTokenGetString(message));
}

static VRKResult VRK_CALL Make(VRKToken objectClass, VRKDictionary parameters, void* context, VRKObject* outObject) {
  const VRKToken messages[] = {Token("message:orvane.localizable-strings.make-default"),
                               Token("message:orvane.localizable-strings.set-translations"),
                               Token("message:orvane.localizable-strings.translate-string")};
  VRKMessageHandler handler = 0;
  (void)objectClass;
  (void)context;
  VRKObjectCreate(0, parameters, outObject);
  VRKMessageHandlerInstall(*outObject, 0, Handle, NULL, 0, 0, &handler);
  VRKMessageHandlerAddMessages(handler, messages, 3);
  return Step("create");
}

VRKResult VRKKolvanesInitialize(uint32_t reserved) {
  VRKObjectFactoryRegister(Token("class:orvane.localizable-strings.string-translator"), reserved, Make, NULL);
  return Step("initialize");
}

VRKResult VRKKolvanesTerminate(uint32_t reserved) {
  VRKObjectFactoryUnregister(reserved, Make, NULL);
  return Step("terminate");
}

uint32_t VRKKolvanesVersion(void) {
  return 0;
}
