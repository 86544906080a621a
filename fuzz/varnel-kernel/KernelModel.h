// What the kernel's headers promise, in the plainest terms, for a walk to hold the kernel against.
#pragma once

#include <array>
#include <cstdint>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "VarnelKernelHost.h"

using Handle = uint32_t;  // of any kind, a token, or any 32 bits

enum class Kind { kObject, kHandler, kData, kList, kDictionary, kToken };

// What a handle stands for: something of any kind, which uses its own of these.
struct Item {
  Kind kind = Kind::kData;
  uint64_t count = 1;

  std::vector<Handle> handlers = {};  // an object's, in the order of installation; some have ended
  int deliveries = 0;
  bool isDying = false;

  Handle object = 0;  // a handler's
  uintptr_t context = 0;
  std::set<Handle> messages = {};
  bool isTold = false;  // of its object's death

  Handle type = 0;  // of data
  std::string bytes = {};
  std::vector<Handle> entries = {};     // a list's; of data, the one that its payload names
  std::map<Handle, Handle> byKey = {};  // a dictionary's
};

// A factory of a class (`from`), or a coercion. No two have the same number.
struct Registration {
  Handle from;
  Handle to;
  uintptr_t context;
  uint32_t number;
};
using Registrations = std::vector<Registration>;

// A message on its way through an object's handlers, or the news of the object's death, which may
// follow.
struct Delivery {
  enum Phase { kMessage, kDeath, kOver };

  Handle object;
  Handle message = 0;
  Handle parameters = 0;
  VRKResult result = kVRKNotHandled;
  Phase phase = kOver;
  std::vector<Handle> left = {};  // the next one last
};

class KernelModel {
 public:
  bool Is(Kind kind, Handle handle) const;
  Item& Add(Kind kind, Handle handle);
  Item& At(Handle handle) { return live.at(handle); }
  void Retain(Handle handle);
  void ReleaseValue(Handle value);
  void EndHandler(Handle handler) { live.erase(handler); }

  // What delivers a message, or releases an object, begins, tells who is Next as long as somebody
  // is, and finishes with its result.
  void BeginDelivery(Delivery& delivery);
  void BeginRelease(Delivery& delivery);
  Handle Next(Delivery& delivery);
  void HaveTold(Handle handler, Delivery& delivery, VRKResult answer);
  VRKResult Finish(Delivery& delivery);

  // Those that serve the pair, the first to be asked last.
  static Registrations Serving(const Registrations& all, Handle from, Handle to);
  // The context of the next coercion that is installed still; 0 for none.
  uintptr_t TakeNext(Registrations& left) const;

  VRKHostLiveCounts Counts() const;
  void ShutDown();

  bool isRunning = false;
  std::map<Handle, Item> live;
  std::vector<Handle> ever;  // what was ever issued
  Registrations factories;
  Registrations coercions;
  std::set<void*> blocks;

 private:
  Handle TakeNext(Delivery& delivery);
  void ReleaseObject(Delivery& delivery);
};

// Tokens last as long as the process. First come texts that every walk knows: messages, keys and
// classes, types, all that the kernel makes itself among them. The others are there to be new.
inline constexpr std::array kKnownTexts = {"message:orvane.vrk.object-died",
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
inline constexpr uint32_t kTexts = 500;

std::string TextOf(uint32_t number);
bool IsToken(Handle token);
Handle TokenOf(uint32_t number);
Handle LastToken();
void AddToken(uint32_t number, Handle token);
void CheckTokenString(Handle token, const char* text);

// What data of a type has as its payload: a handle of this kind, or text.
Kind PayloadKindOf(Handle type);  // kData where it names no handle
bool IsText(Handle type);
