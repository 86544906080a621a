#include "varnel-kernel/Objects.h"

#include <algorithm>
#include <memory>
#include <utility>

namespace varnel_kernel {

// Re-entrant iteration over an object's handlers, newest first. Handlers removed meanwhile leave
// stale handles, which are skipped and purged when the outermost iteration ends. Handlers installed
// meanwhile are not visited.
class Objects::Delivery {
 public:
  Delivery(HandleTable& handleTable, Object& walkedObject, bool deliversObjectDied) noexcept
      : handles(handleTable),
        object(walkedObject),
        isObjectDied(deliversObjectDied),
        left(walkedObject.handlers.size()) {
    ++object.deliveries;
  }
  ~Delivery() {
    if (--object.deliveries != 0 || !object.hasStaleHandlers) return;
    object.hasStaleHandlers = false;
    std::erase_if(object.handlers, [this](VRKMessageHandler registration) {
      return handles.Find<MessageHandler>(registration) == nullptr;
    });
  }
  Delivery(const Delivery&) = delete;
  Delivery& operator=(const Delivery&) = delete;

  // Returns the next live handler that asked for the message, or null at the end.
  VRKMessageHandler Next(VRKToken message) noexcept {
    while (left > 0) {
      const VRKMessageHandler registration = object.handlers[--left];
      const MessageHandler* const handler = handles.Find<MessageHandler>(registration);
      if (handler == nullptr || (isObjectDied && handler->hasReceivedObjectDied)) continue;
      if (handler->messages.contains(message)) return registration;
    }
    return VRKMessageHandler{};
  }

 private:
  HandleTable& handles;
  Object& object;
  const bool isObjectDied;
  size_t left;
};

Objects::Objects(HandleTable& handleTable, TokenTable& tokenTable, Values& valueStore,
                 ActiveCallback*& innermostCode)
    : handles(handleTable),
      tokens(tokenTable),
      values(valueStore),
      running(innermostCode),
      objectDied(tokenTable.TokenOf(kVRKMessageObjectDied)) {}

VRKResult Objects::Create(VRKToken objectClass, VRKDictionary parameters, VRKObject& outObject) {
  if (objectClass == VRKToken{}) return CreatePlain(objectClass, outObject);
  if (!tokens.Holds(objectClass)) return kVRKInvalidHandle;
  const auto factory = std::find_if(factories.rbegin(), factories.rend(), [&](const Factory& each) {
    return each.objectClass == objectClass;
  });
  if (factory == factories.rend()) return kVRKNotFound;
  const Factory called = *factory;
  if (parameters != VRKDictionary{}) return CreateThrough(called, parameters, outObject);

  VRKDictionary empty{};
  values.CreateDictionary(empty);
  const VRKResult result = CreateThrough(called, empty, outObject);
  values.Release<Dictionary>(empty);
  return result;
}

VRKResult Objects::CreatePlain(VRKToken objectClass, VRKObject& outObject) {
  outObject = handles.Add(std::make_unique<Object>(objectClass));
  return kVRKNoError;
}

VRKResult Objects::CreateThrough(const Factory& factory, VRKDictionary parameters,
                                 VRKObject& outObject) {
  VRKObject object{};
  const VRKResult result =
      CallOut(running, kVRKCallbackThrew, factory.callback.function, factory.objectClass,
              parameters, factory.callback.context, &object);
  if (result != kVRKNoError) return result;
  if (handles.Find<Object>(object) == nullptr) return kVRKNoResult;
  outObject = object;
  return kVRKNoError;
}

VRKResult Objects::Deliver(VRKObject object, VRKToken message, VRKDictionary parameters) {
  if (!tokens.Holds(message) || !handles.Retain<Object>(object)) return kVRKInvalidHandle;
  VRKResult result = kVRKNotHandled;
  {
    Delivery delivery(handles, *handles.Find<Object>(object), message == objectDied);
    while (result == kVRKNotHandled) {
      const VRKMessageHandler registration = delivery.Next(message);
      if (registration == VRKMessageHandler{}) break;
      result = Call(registration, object, message, parameters);
    }
  }
  Release(object);
  return result;
}

VRKResult Objects::Call(VRKMessageHandler registration, VRKObject object, VRKToken message,
                        VRKDictionary parameters) {
  MessageHandler& handler = *handles.Find<MessageHandler>(registration);
  if (message == objectDied) handler.hasReceivedObjectDied = true;
  const auto callback = handler.callback;
  const VRKResult result = CallOut(running, kVRKCallbackThrew, callback.function, object, message,
                                   parameters, callback.context);
  if (message == objectDied) Remove(registration, object);
  return result;
}

VRKResult Objects::Retain(VRKObject object) noexcept {
  if (object == VRKObject{}) return kVRKNoError;
  return handles.Retain<Object>(object) ? kVRKNoError : kVRKInvalidHandle;
}

// A running delivery holds a reference. If handlers release references that they do not own, the
// object dies with the delivery's own release.
VRKResult Objects::Release(VRKObject object) {
  if (object == VRKObject{}) return kVRKNoError;
  const Object* const found = handles.Find<Object>(object);
  if (found == nullptr) return kVRKInvalidHandle;
  const bool isLast = handles.Release<Object>(object) == 0;
  if (isLast && found->deliveries == 0) FinalizeObject(object);
  return kVRKNoError;
}

// References that handlers take to a dying object do not keep it alive: its handle is stale once
// all handlers have received object-died.
void Objects::FinalizeObject(VRKObject object) {
  Object& dying = *handles.Find<Object>(object);
  dying.isDying = true;
  {
    Delivery delivery(handles, dying, true);
    for (;;) {
      const VRKMessageHandler registration = delivery.Next(objectDied);
      if (registration == VRKMessageHandler{}) break;
      Call(registration, object, objectDied, VRKDictionary{});
    }
  }
  for (const VRKMessageHandler registration : dying.handlers) {
    handles.Remove<MessageHandler>(registration);
  }
  handles.Remove<Object>(object);
}

VRKResult Objects::Register(VRKToken objectClass, Callback<VRKObjectFactoryCallback> callback) {
  if (!tokens.Holds(objectClass)) return kVRKInvalidHandle;
  const bool exists = std::any_of(factories.begin(), factories.end(), [&](const Factory& each) {
    return each.objectClass == objectClass && each.callback == callback;
  });
  if (exists) return kVRKAlreadyExists;
  factories.push_back({objectClass, callback});
  return kVRKNoError;
}

VRKResult Objects::Unregister(Callback<VRKObjectFactoryCallback> callback) noexcept {
  const auto removed =
      std::erase_if(factories, [&](const Factory& each) { return each.callback == callback; });
  return removed != 0 ? kVRKNoError : kVRKNotFound;
}

VRKResult Objects::Install(VRKObject object, Callback<VRKMessageHandlerCallback> callback,
                           VRKMessageHandler& outRegistration) {
  Object* const found = handles.Find<Object>(object);
  if (found == nullptr || found->isDying) return kVRKInvalidHandle;
  found->handlers.emplace_back();
  try {
    found->handlers.back() = handles.Add(std::make_unique<MessageHandler>(object, callback));
  } catch (...) {
    found->handlers.pop_back();
    throw;
  }
  outRegistration = found->handlers.back();
  return kVRKNoError;
}

VRKResult Objects::AddMessages(VRKMessageHandler registration, const VRKToken* messages,
                               uint32_t count) {
  MessageHandler* const handler = handles.Find<MessageHandler>(registration);
  if (handler == nullptr) return kVRKInvalidHandle;
  if (!std::all_of(messages, messages + count, [&](VRKToken each) { return tokens.Holds(each); })) {
    return kVRKInvalidHandle;
  }
  handler->messages.reserve(handler->messages.size() + count);  // the only statement that throws
  handler->messages.insert(messages, messages + count);
  return kVRKNoError;
}

VRKResult Objects::Remove(VRKMessageHandler registration, VRKObject object) noexcept {
  const MessageHandler* const handler = handles.Find<MessageHandler>(registration);
  if (handler == nullptr || handler->object != object) return kVRKInvalidHandle;
  Object& handled = *handles.Find<Object>(object);
  if (handled.deliveries == 0) {
    std::erase(handled.handlers, registration);
  } else {
    handled.hasStaleHandlers = true;
  }
  handles.Remove<MessageHandler>(registration);
  return kVRKNoError;
}

}  // namespace varnel_kernel
