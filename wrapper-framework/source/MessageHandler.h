// The base class of message handlers.
#pragma once

#include <cstdint>

#include "wrapper-framework/source/KernelRefs.h"
#include "wrapper-framework/source/Memory.h"
#include "wrapper-framework/source/VarnelKernel.h"

namespace Varnel {

// Handles messages to a kernel object. It is attached to at most one object, holds no reference to
// it, and is detached when the object dies. While attached it receives
// "message:orvane.vrk.object-died" and the messages added with AddMessages.
//
// Example: a handler that lives as long as its object.
//
//   auto handler = std::make_unique<Logger>(object, true);  // deletes itself with the object
//   handler->AddMessages(&token, 1);
//   handler.release();
class MessageHandler : public Memory<KernelMemoryPolicy> {
 public:
  // Attaches the handler unless the object is null. With `deletesItself` the handler deletes itself
  // when its object dies. Requires: allocated with new if `deletesItself`. Throws: as SetObject.
  MessageHandler(VRKObject attachTo, bool deletesItself);
  MessageHandler(const MessageHandler&) = delete;
  MessageHandler& operator=(const MessageHandler&) = delete;

  // Ends the registration.
  virtual ~MessageHandler();

  // Detaches the handler from its object and attaches it to another. After a failure the handler is
  // detached, unless the object is null or the kernel refused to detach it.
  // Throws: InputContractViolation for a null object, Exception for the kernel's failures,
  // Exception with kResultHandlerNotInstalled if the kernel stores no registration.
  virtual void SetObject(VRKObject newObject);

  // Called when the object has died, after HandleMessage, also if that threw. Not called if
  // HandleMessage attached the handler to another object.
  virtual void ObjectDied();

  // Returns whether it took the message. An exception becomes the result of the delivery. May
  // delete the handler.
  virtual bool HandleMessage(VRKObject receiver, VRKToken message,
                             const DictionaryRef& parameters) = 0;

  // Adds messages to those that the handler receives. Throws: Exception with
  // kResultHandlerNotInstalled if the handler is detached, Exception for the kernel's failures.
  void AddMessages(const VRKToken* messages, uint32_t count);

 protected:
  // Deletes the handler, after its running calls have returned. Requires: allocated with new.
  void DeleteSelf();

  VRKObject object{};
  VRKMessageHandler registration{};
  bool deleteWhenObjectDies;

 private:
  struct ActiveCall;

  static VRKResult VRK_CALL Callback(VRKObject receiver, VRKToken message, VRKDictionary parameters,
                                     void* context);
  void Install(VRKObject newObject);
};

}  // namespace Varnel
