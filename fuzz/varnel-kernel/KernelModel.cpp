#include "KernelModel.h"

#include <algorithm>
#include <unordered_set>

#include "Input.h"

namespace {

struct Token {
  Handle token = 0;
  const char* kept = nullptr;  // where the kernel has its text
};
std::map<std::string, Token> gTokens;
std::map<Handle, std::string> gTexts;

// Handles that were issued, in walks before too: of the latest million no two are the same.
std::unordered_set<Handle> gEver;

}  // namespace

bool KernelModel::Is(Kind kind, Handle handle) const {
  const auto found = live.find(handle);
  return found != live.end() && found->second.kind == kind;
}

Item& KernelModel::Add(Kind kind, Handle handle) {
  if (gEver.size() == 500'000) gEver.clear();
  Require(handle != 0 && gEver.insert(handle).second, "a handle is new");
  ever.push_back(handle);
  return live.emplace(handle, Item{kind}).first->second;
}

void KernelModel::Retain(Handle handle) {
  if (handle != 0) ++live.at(handle).count;
}

void KernelModel::ReleaseValue(Handle value) {
  const auto found = live.find(value);
  if (found == live.end() || --found->second.count != 0) return;
  const Item dead = found->second;
  live.erase(found);
  for (const Handle entry : dead.entries) ReleaseValue(entry);
  for (const auto& [key, entry] : dead.byKey) ReleaseValue(entry);
}

// A delivery holds a reference to its object.
void KernelModel::BeginDelivery(Delivery& delivery) {
  Item& object = live.at(delivery.object);
  ++object.count;
  ++object.deliveries;
  delivery.left = object.handlers;
  delivery.phase = Delivery::kMessage;
}

void KernelModel::BeginRelease(Delivery& delivery) {
  delivery.result = kVRKNoError;
  ReleaseObject(delivery);
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

Handle KernelModel::Next(Delivery& delivery) {
  if (delivery.phase == Delivery::kMessage) {
    const Handle next = delivery.result == kVRKNotHandled ? TakeNext(delivery) : 0;
    if (next != 0) return next;
    --live.at(delivery.object).deliveries;
    ReleaseObject(delivery);
  }
  return delivery.phase == Delivery::kDeath ? TakeNext(delivery) : 0;
}

// The next handler that has not ended and wants the message; that of death, once.
Handle KernelModel::TakeNext(Delivery& delivery) {
  while (!delivery.left.empty()) {
    const Handle handle = delivery.left.back();
    delivery.left.pop_back();
    if (!Is(Kind::kHandler, handle)) continue;
    Item& handler = live.at(handle);
    const bool isDeath = delivery.message == TokenOf(0);
    if (!handler.messages.contains(delivery.message) || (isDeath && handler.isTold)) continue;
    handler.isTold = handler.isTold || isDeath;
    return handle;
  }
  return 0;
}

void KernelModel::HaveTold(Handle handler, Delivery& delivery, VRKResult answer) {
  if (delivery.message == TokenOf(0)) EndHandler(handler);
  if (delivery.phase == Delivery::kMessage) delivery.result = answer;
}

VRKResult KernelModel::Finish(Delivery& delivery) {
  Require(Next(delivery) == 0, "every handler is told");
  if (delivery.phase == Delivery::kDeath) {
    for (const Handle handler : live.at(delivery.object).handlers) EndHandler(handler);
    live.erase(delivery.object);
  }
  return delivery.result;
}

Registrations KernelModel::Serving(const Registrations& all, Handle from, Handle to) {
  Registrations serving;
  for (const Registration& each : all) {
    if (each.from == from && each.to == to) serving.push_back(each);
  }
  return serving;
}

uintptr_t KernelModel::TakeNext(Registrations& left) const {
  while (!left.empty()) {
    const Registration next = left.back();
    left.pop_back();
    const auto isNext = [&](const Registration& each) { return each.number == next.number; };
    if (std::any_of(coercions.begin(), coercions.end(), isNext)) return next.context;
  }
  return 0;
}

VRKHostLiveCounts KernelModel::Counts() const {
  uint32_t counts[6] = {};
  for (const auto& [handle, item] : live) ++counts[static_cast<size_t>(item.kind)];
  const auto size = [](const auto& all) { return static_cast<uint32_t>(all.size()); };
  return {counts[0],       counts[1],    size(factories),
          size(coercions), counts[2],    counts[3],
          counts[4],       size(blocks), 0};
}

void KernelModel::ShutDown() {
  isRunning = false;
  live.clear();
  factories.clear();
  coercions.clear();
}

std::string TextOf(uint32_t number) {
  if (number < kKnownTexts.size()) return kKnownTexts[number];
  return std::string(number % 40, 'n') + std::to_string(number);
}

bool IsToken(Handle token) {
  return gTexts.contains(token);
}

Handle TokenOf(uint32_t number) {
  return gTokens.at(TextOf(number)).token;
}

Handle LastToken() {
  return gTexts.rbegin()->first;
}

void AddToken(uint32_t number, Handle token) {
  const bool isNew = gTokens.emplace(TextOf(number), Token{token}).second;
  Require(isNew == gTexts.emplace(token, TextOf(number)).second, "a new text has a new token");
  Require(token != 0 && TokenOf(number) == token, "and an old one its own");
}

void CheckTokenString(Handle token, const char* text) {
  Require((text != nullptr) == IsToken(token), "a token has a text");
  if (text == nullptr) return;
  Require(text == gTexts.at(token), "its own");
  const char*& kept = gTokens.at(text).kept;
  Require(kept == nullptr || kept == text, "which stays where it is");
  kept = text;
}

Kind PayloadKindOf(Handle type) {
  const std::string& name = gTexts.at(type);
  if (name == "type:orvane.vrk.list") return Kind::kList;
  if (name == "type:orvane.vrk.dictionary") return Kind::kDictionary;
  return name == "type:orvane.vrk.token" ? Kind::kToken : Kind::kData;
}

bool IsText(Handle type) {
  return gTexts.at(type).starts_with("type:orvane.vrk.utf");
}
