/* A plug-in that has one answer to every key, and that fails with the result at the step which the
 * environment variable STUBBORN gives, such as "15 initialize": an entry point, an object's creation or
 * a message, by the end of its name; or "unload", which it keeps the kernel from.
 */
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "kolvane/source/VRKKolvanes.h"

static VRKResult Step(const char* name) {
  const char* const chosen = getenv("STUBBORN");
  unsigned result = 0;
  char step[32] = "";
  if (chosen == NULL || sscanf(chosen, "%u %31s", &result, step) != 2) return 0;
  return strlen(name) >= strlen(step) && strcmp(name + strlen(name) - strlen(step), step) == 0 ? result : 0;
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
  if (Step("unload") == 0) VRKObjectFactoryUnregister(reserved, Make, NULL);
  return Step("terminate");
}

uint32_t VRKKolvanesVersion(void) {
  return 0;
}
