#include "MessageHandler.h"

#include "Boundary.h"
#include "Exceptions.h"
#include "ResultCodes.h"
#include "Tokens.h"

namespace Varnel {
namespace {

VRKToken gObjectDied{};
bool gObjectDiedIsMissing = true;

void MakeObjectDied() {
  if (!gObjectDiedIsMissing) return;
  gObjectDied = MakeToken("message:orvane.vrk.object-died");
  gObjectDiedIsMissing = false;
}

}  // namespace

MessageHandler::MessageHandler(VRKObject attachTo, bool deletesItself)
    : deleteWhenObjectDies(deletesItself) {
  MakeObjectDied();
  if (attachTo != VRKObject{}) Install(attachTo);
}

MessageHandler::~MessageHandler() {
  if (registration != VRKMessageHandler{}) VRKMessageHandlerRemove(registration, object);
}

void MessageHandler::SetObject(VRKObject newObject) {
  if (newObject == VRKObject{}) throw InputContractViolation();
  if (newObject == object) return;
  if (object != VRKObject{}) {
    ThrowIfFailed(VRKMessageHandlerRemove(registration, object));
    object = {};
    registration = {};
  }
  Install(newObject);
}

void MessageHandler::ObjectDied() {
  if (deleteWhenObjectDies) {
    delete this;
    return;
  }
  object = {};
  registration = {};
}

void MessageHandler::AddMessages(const VRKToken* messages, uint32_t count) {
  if (registration == VRKMessageHandler{}) ThrowResultCode(kResultHandlerNotInstalled);
  ThrowIfFailed(VRKMessageHandlerAddMessages(registration, messages, count));
}

// A constructor that throws runs no destructor, so what fails here is undone here.
void MessageHandler::Install(VRKObject newObject) {
  VRKMessageHandler installed{};
  ThrowIfFailed(VRKMessageHandlerInstall(newObject, 0, &Callback, this, 0, 0, &installed));
  object = newObject;
  registration = installed;
  try {
    AddMessages(&gObjectDied, 1);
  } catch (...) {
    if (registration != VRKMessageHandler{}) VRKMessageHandlerRemove(registration, object);
    object = {};
    registration = {};
    throw;
  }
}

// The handler may be gone when HandleMessage or ObjectDied returns. It hears of its object's death
// whatever goes wrong on the way, or it would be left behind on an object that is no more.
VRKResult VRK_CALL MessageHandler::Callback(VRKObject receiver, VRKToken message,
                                            VRKDictionary parameters, void* context) {
  MessageHandler& handler = *static_cast<MessageHandler*>(context);
  const VRKResult handled = AtBoundary(parameters, [&] {
    const DictionaryRef held(parameters);
    const bool taken = handler.HandleMessage(receiver, message, held);
    return taken ? kResultNoError : kResultNotHandled;
  });
  if (message != gObjectDied) return handled;
  return AtBoundary(parameters, [&] {
    handler.ObjectDied();
    return handled;
  });
}

}  // namespace Varnel
