// The base of what answers the messages to a kernel object.
#pragma once

#include <cstdint>

#include "Holders.h"
#include "Memory.h"
#include "VarnelKernel.h"

namespace Varnel {

// Attached to at most one object, to which it holds no reference; detached again when the object
// dies. Attached, it receives "message:orvane.vrk.object-died" and what it asks for.
class MessageHandler : public Memory<KernelMemoryPolicy> {
 public:
  // Attaches the handler unless the object is null. With `deletesItself` the handler, which was
  // then made with new, deletes itself when its object dies. Throws what SetObject throws.
  MessageHandler(VRKObject attachTo, bool deletesItself);
  MessageHandler(const MessageHandler&) = delete;
  MessageHandler& operator=(const MessageHandler&) = delete;

  // Ends the registration.
  virtual ~MessageHandler();

  // Attaches the handler to an object, and detaches it from the one it was on. When it fails, the
  // handler is detached, unless the object is null (InputContractViolation) or the kernel does not
  // let the handler off its object. A registration that is null is an Exception of
  // kResultHandlerNotInstalled.
  virtual void SetObject(VRKObject newObject);

  // Called when the object has died, after HandleMessage was, also if that threw.
  virtual void ObjectDied();

  // Returns whether it took the message; what it throws becomes the delivery's result. It may
  // delete the handler, except when the object has died.
  virtual bool HandleMessage(VRKObject receiver, VRKToken message,
                             const DictionaryRef& parameters) = 0;

  // Asks for messages, besides those asked for before. Throws the Exception of
  // kResultHandlerNotInstalled on a detached handler.
  void AddMessages(const VRKToken* messages, uint32_t count);

 protected:
  // Deletes the handler, which was made with new: at once, or when the calls of it that are running
  // have returned.
  void DeleteSelf();

  VRKObject object{};
  VRKMessageHandler registration{};
  bool deleteWhenObjectDies;

 private:
  struct RunningCall;

  static VRKResult VRK_CALL Callback(VRKObject receiver, VRKToken message, VRKDictionary parameters,
                                     void* context);
  void Install(VRKObject newObject);
};

}  // namespace Varnel
