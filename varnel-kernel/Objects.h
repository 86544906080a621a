// Objects, their message handlers, and the factories that create them.
#pragma once

#include <boost/unordered/unordered_flat_set.hpp>
#include <cstdint>
#include <vector>

#include "varnel-kernel/Callbacks.h"
#include "varnel-kernel/HandleTable.h"
#include "varnel-kernel/TokenTable.h"
#include "varnel-kernel/Values.h"
#include "wrapper-framework/source/VarnelKernel.h"

namespace varnel_kernel {

struct Object final : Item {
  using Handle = VRKObject;
  static constexpr Kind kKind = Kind::kObject;

  explicit Object(VRKToken token) : objectClass(token) {}

  const VRKToken objectClass;
  std::vector<VRKMessageHandler> handlers;  // in order of installation; may contain stale handles
  uint32_t deliveries = 0;                  // running ones, which iterate over `handlers`
  bool hasStaleHandlers = false;            // removed during a delivery
  bool isDying = false;
};

struct MessageHandler final : Item {
  using Handle = VRKMessageHandler;
  static constexpr Kind kKind = Kind::kMessageHandler;

  MessageHandler(VRKObject handledObject, Callback<VRKMessageHandlerCallback> handlerCallback)
      : object(handledObject), callback(handlerCallback) {}

  const VRKObject object;
  const Callback<VRKMessageHandlerCallback> callback;
  boost::unordered_flat_set<VRKToken> messages;
  bool hasReceivedObjectDied = false;  // the message is delivered to it once
};

struct Factory {
  VRKToken objectClass;
  Callback<VRKObjectFactoryCallback> callback;
};

// Handles may be any 32 bits. Callbacks may call any kernel operation while they run, also on the
// object, handler or factory that they run for. Requires: outs are not null.
class Objects {
 public:
  Objects(HandleTable& handleTable, TokenTable& tokenTable, Values& valueStore,
          ActiveCallback*& innermostCode);

  VRKResult Create(VRKToken objectClass, VRKDictionary parameters, VRKObject& outObject);
  VRKResult Deliver(VRKObject object, VRKToken message, VRKDictionary parameters);
  VRKResult Retain(VRKObject object) noexcept;
  VRKResult Release(VRKObject object);

  VRKResult Register(VRKToken objectClass, Callback<VRKObjectFactoryCallback> callback);
  VRKResult Unregister(Callback<VRKObjectFactoryCallback> callback) noexcept;

  VRKResult Install(VRKObject object, Callback<VRKMessageHandlerCallback> callback,
                    VRKMessageHandler& outRegistration);
  VRKResult AddMessages(VRKMessageHandler registration, const VRKToken* messages, uint32_t count);
  VRKResult Remove(VRKMessageHandler registration, VRKObject object) noexcept;

  const std::vector<Factory>& Factories() const noexcept { return factories; }
  void Clear() noexcept { factories.clear(); }

 private:
  class Delivery;

  VRKResult CreatePlain(VRKToken objectClass, VRKObject& outObject);
  VRKResult CreateThrough(const Factory& factory, VRKDictionary parameters, VRKObject& outObject);
  VRKResult Call(VRKMessageHandler registration, VRKObject object, VRKToken message,
                 VRKDictionary parameters);
  void FinalizeObject(VRKObject object);

  HandleTable& handles;
  TokenTable& tokens;
  Values& values;
  ActiveCallback*& running;
  const VRKToken objectDied;
  std::vector<Factory> factories;  // in order of registration
};

}  // namespace varnel_kernel
