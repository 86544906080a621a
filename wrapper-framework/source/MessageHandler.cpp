#include "wrapper-framework/source/MessageHandler.h"

#include "wrapper-framework/source/Boundary.h"
#include "wrapper-framework/source/DestructionScope.h"
#include "wrapper-framework/source/Exceptions.h"
#include "wrapper-framework/source/ResultCodes.h"
#include "wrapper-framework/source/Tokens.h"

namespace Varnel {
namespace {

VRKToken gObjectDied{};
bool gObjectDiedIsMissing = true;

void MakeObjectDied() {
  if (!gObjectDiedIsMissing) return;
  gObjectDied = MakeToken(kVRKMessageObjectDied);
  gObjectDiedIsMissing = false;
}

}  // namespace

// A running call of a handler. The objects form a stack, linked from the innermost call outwards.
struct MessageHandler::ActiveCall {
  explicit ActiveCall(MessageHandler* calledHandler) noexcept
      : handler(calledHandler), outer(innermost) {
    innermost = this;
  }
  ~ActiveCall() {
    innermost = outer;
    if (deletesHandler) delete handler;
  }
  ActiveCall(const ActiveCall&) = delete;
  ActiveCall& operator=(const ActiveCall&) = delete;

  static ActiveCall* OutermostOf(const MessageHandler* handler) noexcept {
    ActiveCall* outermost = nullptr;
    for (ActiveCall* each = innermost; each != nullptr; each = each->outer) {
      if (each->handler == handler) outermost = each;
    }
    return outermost;
  }

  static inline ActiveCall* innermost = nullptr;

  MessageHandler* handler;  // null once it is destroyed
  ActiveCall* outer;
  bool deletesHandler = false;
};

MessageHandler::MessageHandler(VRKObject attachTo, bool deletesItself)
    : deleteWhenObjectDies(deletesItself) {
  MakeObjectDied();
  if (attachTo != VRKObject{}) Install(attachTo);
}

MessageHandler::~MessageHandler() {
  const DestructionScope destruction(this);
  while (ActiveCall* const call = ActiveCall::OutermostOf(this)) {
    call->handler = nullptr;
  }
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
    DeleteSelf();
    return;
  }
  object = {};
  registration = {};
}

void MessageHandler::DeleteSelf() {
  if (ActiveCall* const call = ActiveCall::OutermostOf(this)) {
    call->deletesHandler = true;
  } else {
    delete this;
  }
}

void MessageHandler::AddMessages(const VRKToken* messages, uint32_t count) {
  if (registration == VRKMessageHandler{}) ThrowResultCode(kResultHandlerNotInstalled);
  ThrowIfFailed(VRKMessageHandlerAddMessages(registration, messages, count));
}

// Called from constructors, whose destructor does not run on failure: rolls back itself.
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

// HandleMessage may delete the handler, or attach it to another object, whose registration must
// stay. Otherwise ObjectDied is called even if HandleMessage threw: the object is gone.
VRKResult VRK_CALL MessageHandler::Callback(VRKObject receiver, VRKToken message,
                                            VRKDictionary parameters, void* context) {
  MessageHandler& handler = *static_cast<MessageHandler*>(context);
  if (DestructionScope::IsDestroying(&handler)) return kResultNotHandled;
  ActiveCall call(&handler);
  const VRKMessageHandler served = handler.registration;
  const VRKResult handled = AtBoundary(parameters, [&] {
    const DictionaryRef held(parameters);
    const bool taken = handler.HandleMessage(receiver, message, held);
    return taken ? kResultNoError : kResultNotHandled;
  });
  if (message != gObjectDied || call.handler == nullptr) return handled;
  const VRKMessageHandler current = handler.registration;
  if (current != VRKMessageHandler{} && current != served) return handled;
  return AtBoundary(parameters, [&] {
    handler.ObjectDied();
    return handled;
  });
}

}  // namespace Varnel
