// What the kernel's headers promise, in the plainest terms, for a walk to hold the kernel against.
#pragma once

#include <array>
#include <cstdint>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "varnel-kernel/VarnelKernelHost.h"

using Handle = uint32_t;  // of any kind, a token, or any 32 bits
using Key = uint64_t;     // a handle, or the number of a factory or coercion, which is larger

// What lives, in the order of the kernel's counts, and tokens.
enum class Kind { kObject, kHandler, kFactory, kCoercion, kData, kList, kDictionary, kToken };

// Something of any kind, which uses its own of these.
struct Item {
  Kind kind = Kind::kData;
  uint64_t count = 1;

  std::vector<Key> handlers = {};  // an object's, in the order of installation; some have ended
  int deliveries = 0;
  bool isDying = false;

  uintptr_t context = 0;  // a handler's, factory's or coercion's
  Handle object = 0;      // a handler's
  std::set<Handle> messages = {};
  bool isTold = false;  // of its object's death

  Handle type = 0;    // of data; what a factory serves, or a coercion coerces
  Handle toType = 0;  // what a coercion coerces into
  std::string bytes = {};
  // A list's by index, a dictionary's by key; of data, the value that its payload names.
  std::map<Handle, Handle> entries = {};
};

// A message on its way through an object's handlers, or the news of the object's death, which may
// follow.
struct Delivery {
  enum Phase { kMessage, kDeath, kOver };

  Handle object;
  Handle message = 0;
  Handle parameters = 0;
  VRKResult result = kVRKNoError;
  Phase phase = kOver;
  std::vector<Key> left = {};  // the next one last
  Key told = 0;                // the latest
};

class KernelModel {
 public:
  bool Is(Kind kind, Key key) const;
  Item& Add(Kind kind, Handle handle);
  Item& At(Key key) { return live.at(key); }
  void Register(Kind kind, Handle type, Handle toType, uintptr_t context);
  void Retain(Handle handle);
  void ReleaseValue(Handle value);

  // Those that serve the type, or pair of types, the first to be asked last.
  std::vector<Key> Serving(Kind kind, Handle type, Handle toType) const;
  // The next coercion that is installed still; 0 for none.
  Key TakeCoercion(std::vector<Key>& left) const;

  // What delivers a message, or releases an object, begins, learns of each answer who is Next as
  // long as somebody is, and finishes with its result.
  void BeginDelivery(Delivery& delivery);
  void ReleaseObject(Delivery& delivery);
  Key Next(Delivery& delivery, VRKResult answer);
  VRKResult Finish(Delivery& delivery, VRKResult answer);

  void CheckCounts(const VRKHostLiveCounts& counts) const;

  bool isRunning = false;
  std::map<Key, Item> live;
  std::vector<Handle> ever;                   // what was ever issued
  std::array<std::vector<Handle>, 7> latest;  // of each kind, perhaps dead
  std::set<void*> blocks;
  uint64_t nextNumber = uint64_t{1} << 32;

 private:
  Key TakeHandler(Delivery& delivery);
};

// Tokens last as long as the process. These texts are all that there are: messages, keys and
// classes, types, all that the kernel makes itself among them.
inline constexpr std::array kTexts = {"message:orvane.vrk.object-died",
                                      "one",
                                      "a text that is too long to stand within a string",
                                      "",
                                      "type:orvane.vrk.utf8",
                                      "type:orvane.vrk.token",
                                      "type:orvane.vrk.list",
                                      "type:orvane.vrk.dictionary",
                                      "type:orvane.vrk.utf16",
                                      "type:orvane.vrk.utf16le",
                                      "type:orvane.vrk.utf16be"};

bool IsToken(Handle token);
Handle TokenOf(size_t number);  // of a text; 0 where it has none yet
void HaveToken(size_t number, Handle token);
void CheckTokenString(Handle token);

// What data of a type has as its payload: a handle of this kind, or text.
Kind PayloadKindOf(Handle type);  // kData where it names no handle
bool IsText(Handle type);
