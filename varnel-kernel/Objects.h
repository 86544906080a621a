// Objects, the handlers attached to them, and the factories that make them.
#pragma once

#include <boost/unordered/unordered_flat_set.hpp>
#include <cstdint>
#include <vector>

#include "Callbacks.h"
#include "HandleTable.h"
#include "TokenTable.h"
#include "Values.h"
#include "VarnelKernel.h"

namespace varnel_kernel {

struct Object final : Item {
  using Handle = VRKObject;
  static constexpr Kind kKind = Kind::kObject;

  explicit Object(VRKToken token) : objectClass(token) {}

  const VRKToken objectClass;
  std::vector<VRKMessageHandler>
      handlers;                   // in the order of installation; stale ones may stand there
  uint32_t deliveries = 0;        // that walk the handlers now
  bool hasStaleHandlers = false;  // removed during a delivery
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
  bool isToldOfDeath = false;  // of its object's; it is told once
};

struct Factory {
  VRKToken objectClass;
  Callback<VRKObjectFactoryCallback> callback;
};

// The operations on them. Handles may be any 32 bits; outs are not null. Callbacks may do anything
// that the kernel offers while they run, to what they run for too.
class Objects {
 public:
  Objects(HandleTable& handleTable, TokenTable& tokenTable, Values& valueStore,
          RunningCode*& innermostCode);

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
  void Die(VRKObject object);

  HandleTable& handles;
  TokenTable& tokens;
  Values& values;
  RunningCode*& running;
  const VRKToken objectDied;
  std::vector<Factory> factories;  // in the order of registration
};

}  // namespace varnel_kernel
