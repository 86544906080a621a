// A walk over translator objects and the plug-in that serves them, beside a model that knows what
// each of them answers.
#pragma once

#include <cstdint>
#include <deque>
#include <map>
#include <memory>
#include <string>

#include "Choices.h"
#include "Holders.h"
#include "VarnelKernelHost.h"

// The model of a translator.
struct ModelTranslator {
  bool IsAlive() const { return !isDoomed || serving > 0; }

  std::map<std::string, std::string> entries;
  int serving = 0;  // messages, which it outlives
  bool isDoomed = false;
};

// An object to which the walk has a reference, or had.
struct WalkedObject {
  bool IsStale() const { return isReleased && deliveries == 0; }
  bool TakesMessages() const { return isServed && !IsStale(); }

  // Its handler goes, and with an owner's the translator.
  void EndService();

  // What a message results in that translators take.
  VRKResult Expected() const;

  VRKObject object;
  std::shared_ptr<ModelTranslator> model;
  bool isOwner;  // else it was made of the default class
  bool isServed = true;
  bool isReleased = false;
  int deliveries = 0;
};

// Ends the process where an answer is not the model's. In one kernel there is one walk at a time.
class TranslatorWalk {
 public:
  TranslatorWalk(Choices& decisions, VRKPlugIn walkedPlugIn);
  TranslatorWalk(const TranslatorWalk&) = delete;
  TranslatorWalk& operator=(const TranslatorWalk&) = delete;

  // Does one thing, in which others may be nested.
  void Step();

  // Releases every object and terminates the plug-in. Steps may follow.
  void Rest();

  // Messages delivered and keys coerced, by their results.
  const std::map<VRKResult, uint64_t>& Results() const { return results; }

 private:
  using Model = std::shared_ptr<ModelTranslator>;

  void Initialize();
  void Terminate();
  void Create(bool isOwner);
  void Release(WalkedObject& which);
  void TellOfDeath(WalkedObject& whom);
  void MakeDefault(const WalkedObject& which);
  void SetTranslations(const WalkedObject& of);
  void Translate(const WalkedObject& by);
  void TranslateLocaleIndependent(const WalkedObject& by);
  void TranslateMeanwhile(WalkedObject& by);
  void Coerce();

  std::string RandomName();
  std::string RandomValue();
  std::string RandomKey();
  std::string RandomImage(const std::map<std::string, std::string>& entries);

  bool DefaultIsAlive() const { return defaultModel != nullptr && defaultModel->IsAlive(); }
  std::string Answer(const ModelTranslator& model, const std::string& key) const;
  VRKResult Send(const WalkedObject& to, const char* message,
                 const Varnel::DictionaryRef& parameters = {});
  VRKResult Noted(VRKResult result);

  Choices& choices;
  const VRKPlugIn plugIn;
  bool isInitialised = false;
  int depth = 0;
  Model defaultModel;
  std::deque<Model> kept;  // by the kernel, of the first translators
  std::deque<WalkedObject> objects;
  std::map<VRKResult, uint64_t> results;
};
