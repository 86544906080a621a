// A plug-in that makes an object and leaves behind what the host told it to: nothing, or a `factory`,
// `coercion` or `handler` that its terminate entry does not end.
#include <string>

#include "wrapper-framework/source/VarnelKernel.h"

#if defined(_WIN32)
#define EXPORTED extern "C" __declspec(dllexport)
#else
#define EXPORTED extern "C" __attribute__((visibility("default")))
#endif

namespace {

std::string gTold;

VRKToken Token(const char* text) {
  VRKToken token{};
  VRKTokenCreate(text, 1, &token);
  return token;
}

VRKResult VRK_CALL Make(VRKToken, VRKDictionary, void*, VRKObject* outObject) {
  return VRKObjectCreate(VRKToken{}, VRKDictionary{}, outObject);
}

VRKResult VRK_CALL Coerce(VRKData, VRKToken, VRKToken, void*, VRKData*) {
  return kVRKCannotCoerce;
}

VRKResult VRK_CALL Handle(VRKObject, VRKToken, VRKDictionary, void*) {
  return kVRKNoError;
}

}  // namespace

EXPORTED void VRK_CALL TestLeave(const char* what) {
  gTold = what;
}

EXPORTED VRKResult VRK_CALL TestInitialize(uint32_t) {
  VRKObject kept{};
  VRKObjectFactoryRegister(Token("class:test.plug-in"), 0, Make, nullptr);
  VRKResult result = VRKObjectCreate(Token("class:test.plug-in"), VRKDictionary{}, &kept);
  if (gTold != "factory") VRKObjectFactoryUnregister(0, Make, nullptr);
  if (gTold == "coercion") {
    VRKDataCoercionHandlerInstall(Token("type:test.a"), Token("type:test.b"), 0, Coerce, nullptr);
  }
  if (gTold == "handler") {
    VRKObject everlasting{};
    VRKMessageHandler registration{};
    VRKObjectCreate(VRKToken{}, VRKDictionary{}, &everlasting);
    VRKMessageHandlerInstall(everlasting, 0, Handle, nullptr, 0, 0, &registration);
  }
  VRKObjectRelease(kept);
  return result;
}

EXPORTED VRKResult VRK_CALL TestTerminate(uint32_t) {
  return kVRKNoError;
}

EXPORTED uint32_t VRK_CALL TestVersion() {
  return 0x00020003;
}
