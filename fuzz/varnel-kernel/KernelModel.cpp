#include "fuzz/varnel-kernel/KernelModel.h"

#include <algorithm>
#include <cstring>
#include <unordered_set>

#include "fuzz/Input.h"

namespace {

struct Token {
  Handle handle = 0;
  const char* kept = nullptr;  // where the kernel has its text
};
std::array<Token, kTexts.size()> gTokens;

// Handles that were issued, in walks before too: of the latest million no two are the same.
std::unordered_set<Handle> gEver;

size_t NumberOf(Handle token) {
  size_t number = 0;
  while (number < gTokens.size() && gTokens[number].handle != token) ++number;
  return number;
}

}  // namespace

bool KernelModel::Is(Kind kind, Key key) const {
  const auto found = live.find(key);
  return found != live.end() && found->second.kind == kind;
}

Item& KernelModel::Add(Kind kind, Handle handle) {
  if (gEver.size() == 500'000) gEver.clear();
  Require(handle != 0 && gEver.insert(handle).second, "a handle is new");
  ever.push_back(handle);
  latest[static_cast<size_t>(kind)].push_back(handle);
  return live.emplace(handle, Item{kind}).first->second;
}

void KernelModel::Register(Kind kind, Handle type, Handle toType, uintptr_t context) {
  Item& added = live[nextNumber++];
  added.kind = kind;
  added.context = context;
  added.type = type;
  added.toType = toType;
}

void KernelModel::Retain(Handle handle) {
  if (handle != 0) ++live.at(handle).count;
}

void KernelModel::ReleaseValue(Handle value) {
  const auto found = live.find(value);
  if (found == live.end() || --found->second.count != 0) return;
  const Item dead = found->second;
  live.erase(found);
  for (const auto& [key, entry] : dead.entries) ReleaseValue(entry);
}

std::vector<Key> KernelModel::Serving(Kind kind, Handle type, Handle toType) const {
  std::vector<Key> serving;
  for (const auto& [key, each] : live) {
    if (each.kind == kind && each.type == type && each.toType == toType) serving.push_back(key);
  }
  return serving;
}

Key KernelModel::TakeCoercion(std::vector<Key>& left) const {
  Key taken = 0;
  while (!left.empty() && !Is(Kind::kCoercion, taken)) {
    taken = left.back();
    left.pop_back();
  }
  return Is(Kind::kCoercion, taken) ? taken : 0;
}

// A delivery holds a reference to its object.
void KernelModel::BeginDelivery(Delivery& delivery) {
  Item& object = live.at(delivery.object);
  ++object.count;
  ++object.deliveries;
  delivery.left = object.handlers;
  delivery.phase = Delivery::kMessage;
}

// An object without references dies, once, and not during a delivery, whose end it awaits.
void KernelModel::ReleaseObject(Delivery& delivery) {
  Item& object = live.at(delivery.object);
  if (object.count != 0) --object.count;
  delivery.phase = Delivery::kOver;
  if (object.count != 0 || object.deliveries != 0 || object.isDying) return;
  object.isDying = true;
  delivery.phase = Delivery::kDeath;
  delivery.left = object.handlers;
  delivery.message = TokenOf(0);
  delivery.parameters = 0;
}

Key KernelModel::Next(Delivery& delivery, VRKResult answer) {
  if (delivery.message == TokenOf(0)) live.erase(delivery.told);
  delivery.told = 0;
  if (delivery.phase == Delivery::kMessage) {
    delivery.result = answer;
    if (answer == kVRKNotHandled) delivery.told = TakeHandler(delivery);
    if (delivery.told != 0) return delivery.told;
    --live.at(delivery.object).deliveries;
    ReleaseObject(delivery);
  }
  if (delivery.phase == Delivery::kDeath) delivery.told = TakeHandler(delivery);
  return delivery.told;
}

// The next handler that has not ended and wants the message; that of death, once.
Key KernelModel::TakeHandler(Delivery& delivery) {
  while (!delivery.left.empty()) {
    const Key key = delivery.left.back();
    delivery.left.pop_back();
    if (!Is(Kind::kHandler, key)) continue;
    Item& handler = live.at(key);
    const bool isDeath = delivery.message == TokenOf(0);
    if (!handler.messages.contains(delivery.message) || (isDeath && handler.isTold)) continue;
    handler.isTold = handler.isTold || isDeath;
    return key;
  }
  return 0;
}

VRKResult KernelModel::Finish(Delivery& delivery, VRKResult answer) {
  Require(Next(delivery, answer) == 0, "every handler is told");
  if (delivery.phase == Delivery::kDeath) {
    for (const Key handler : live.at(delivery.object).handlers) live.erase(handler);
    live.erase(delivery.object);
  }
  return delivery.result;
}

void KernelModel::CheckCounts(const VRKHostLiveCounts& counts) const {
  uint32_t expected[sizeof counts / sizeof(uint32_t)] = {};
  for (const auto& [key, item] : live) ++expected[static_cast<size_t>(item.kind)];
  expected[7] = static_cast<uint32_t>(blocks.size());
  Require(std::memcmp(&counts, expected, sizeof counts) == 0, "so much is alive");
}

bool IsToken(Handle token) {
  return token != 0 && NumberOf(token) != gTokens.size();
}

Handle TokenOf(size_t number) {
  return gTokens[number].handle;
}

void HaveToken(size_t number, Handle token) {
  if (TokenOf(number) == 0 && !IsToken(token))
    gTokens[number] = {token, VRKTokenGetString(VRKToken{token})};
  Require(token != 0 && TokenOf(number) == token, "a text has a token of its own");
  CheckTokenString(token);
}

void CheckTokenString(Handle token) {
  const char* const text = VRKTokenGetString(VRKToken{token});
  Require((text != nullptr) == IsToken(token), "a token has a text");
  if (text == nullptr) return;
  const size_t number = NumberOf(token);
  Require(text == std::string(kTexts[number]), "its own");
  Require(text == gTokens[number].kept, "which stays where it is");
}

Kind PayloadKindOf(Handle type) {
  const size_t number = NumberOf(type);
  if (number == 5) return Kind::kToken;
  if (number == 6) return Kind::kList;
  return number == 7 ? Kind::kDictionary : Kind::kData;
}

bool IsText(Handle type) {
  return type == TokenOf(4) || NumberOf(type) > 7;
}
