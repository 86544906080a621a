#include "varnel-kernel/PlugIns.h"

#include <algorithm>
#include <memory>
#include <utility>

namespace varnel_kernel {
namespace {

template <class Function>
bool FindEntryPoint(platform::SharedLibrary library, const std::string& name, Function& function,
                    std::string& reason) {
  function = reinterpret_cast<Function>(platform::FindFunction(library, name.c_str()));
  if (function == nullptr) reason = "it has no entry point " + name;
  return function != nullptr;
}

template <class Function>
bool IsIn(const platform::AddressRange& code, Function function) noexcept {
  return code.Contains(reinterpret_cast<const void*>(function));
}

}  // namespace

std::unique_ptr<PlugIn> FindPlugIn(platform::SharedLibrary library, const char* prefix,
                                   std::string& reason) {
  const std::string name = prefix;
  auto plugIn = std::make_unique<PlugIn>();
  plugIn->library = library;
  plugIn->addresses = platform::AddressesOf(library);
  const bool complete = FindEntryPoint(library, name + "Initialize", plugIn->initialize, reason) &&
                        FindEntryPoint(library, name + "Terminate", plugIn->terminate, reason) &&
                        FindEntryPoint(library, name + "Version", plugIn->version, reason);
  return complete ? std::move(plugIn) : nullptr;
}

PlugIns::PlugIns(HandleTable& handleTable, Objects& objectStore, Coercions& coercionStore,
                 const Trace& hostTrace, const ErrorReports& hostReports,
                 ActiveCallback*& innermostCode)
    : handles(handleTable),
      objects(objectStore),
      coercions(coercionStore),
      trace(hostTrace),
      reports(hostReports),
      running(innermostCode) {}

VRKPlugIn PlugIns::Add(std::unique_ptr<PlugIn> plugIn) {
  return handles.Add(std::move(plugIn));
}

VRKResult PlugIns::Initialize(VRKPlugIn plugIn) {
  PlugIn* const found = handles.Find<PlugIn>(plugIn);
  if (found == nullptr) return kVRKInvalidHandle;
  if (IsRunning(found->addresses)) return kVRKInUse;
  PlugIn* const outer = std::exchange(initialising, found);
  const VRKResult result = CallOut(running, kVRKCallbackThrew, found->initialize, 0u);
  initialising = outer;
  return result;
}

VRKResult PlugIns::Terminate(VRKPlugIn plugIn) {
  PlugIn* const found = handles.Find<PlugIn>(plugIn);
  if (found == nullptr) return kVRKInvalidHandle;
  if (IsRunning(found->addresses)) return kVRKInUse;
  const ActiveCallback terminating(running, found->terminate);  // also while objects are released
  const VRKResult result = CallOut(running, kVRKCallbackThrew, found->terminate, 0u);
  ReleaseRetained(*found, 0);
  return result;
}

VRKResult PlugIns::Version(VRKPlugIn plugIn, uint32_t& outVersion) {
  const PlugIn* const found = handles.Find<PlugIn>(plugIn);
  if (found == nullptr) return kVRKInvalidHandle;
  outVersion = CallOut(running, uint32_t{0}, found->version);
  return kVRKNoError;
}

// Registrations are checked first, while nothing is lost by refusing. Retained objects are released
// before handlers are checked, because their handlers end with them. Code that runs meanwhile
// cannot unload the library, but may register something, so registrations are checked again.
VRKResult PlugIns::Remove(VRKPlugIn plugIn, platform::SharedLibrary& outLibrary) {
  PlugIn* const found = handles.Find<PlugIn>(plugIn);
  if (found == nullptr) return kVRKInvalidHandle;
  const platform::AddressRange& code = found->addresses;
  if (IsRunning(code) || HasRegistrations(code)) return kVRKInUse;
  {
    const ActiveCallback releasing(running, found->initialize);
    ReleaseRetained(*found, 0);
  }
  const bool isNeeded =
      HasRegistrations(code) || HandlesMessages(code) || !found->retainedObjects.empty();
  if (isNeeded) return kVRKInUse;
  outLibrary = found->library;
  handles.Remove<PlugIn>(plugIn);
  return kVRKNoError;
}

// If a creation fails, the objects that its factory created on the way are not retained.
VRKResult PlugIns::CreateObject(VRKToken objectClass, VRKDictionary parameters,
                                VRKObject& outObject) {
  PlugIn* const keeper = initialising;
  if (keeper == nullptr) return objects.Create(objectClass, parameters, outObject);
  const size_t keptBefore = keeper->retainedObjects.size();
  VRKObject object{};
  const VRKResult result = objects.Create(objectClass, parameters, object);
  if (result != kVRKNoError) {
    ReleaseRetained(*keeper, keptBefore);
    return result;
  }
  try {
    keeper->retainedObjects.push_back(object);
  } catch (...) {
    ReleaseRetained(*keeper, keptBefore);
    objects.Release(object);
    throw;
  }
  objects.Retain(object);
  outObject = object;
  return kVRKNoError;
}

bool PlugIns::MustStay(platform::SharedLibrary library,
                       const platform::AddressRange& addresses) const noexcept {
  bool isKept = false;
  handles.ForEach<PlugIn>(
      [&](VRKPlugIn, const PlugIn& plugIn) { isKept = isKept || plugIn.library == library; });
  if (isKept) return false;
  return IsRunning(addresses) || HasRegistrations(addresses) || HandlesMessages(addresses);
}

bool PlugIns::IsRunning(const platform::AddressRange& code) const noexcept {
  for (const ActiveCallback* each = running; each != nullptr; each = each->Outer()) {
    if (code.Contains(each->Address())) return true;
  }
  return false;
}

bool PlugIns::HasRegistrations(const platform::AddressRange& code) const noexcept {
  const auto isIn = [&](const auto& each) { return IsIn(code, each.callback.function); };
  const auto& factories = objects.Factories();
  const auto& installed = coercions.Installed();
  return std::any_of(factories.begin(), factories.end(), isIn) ||
         std::any_of(installed.begin(), installed.end(), isIn) || IsIn(code, trace.Hook()) ||
         IsIn(code, reports.Reporter());
}

bool PlugIns::HandlesMessages(const platform::AddressRange& code) const noexcept {
  bool any = false;
  handles.ForEach<MessageHandler>([&](VRKMessageHandler, const MessageHandler& handler) {
    any = any || IsIn(code, handler.callback.function);
  });
  return any;
}

void PlugIns::ReleaseRetained(PlugIn& plugIn, size_t from) {
  while (plugIn.retainedObjects.size() > from) {
    const VRKObject object = plugIn.retainedObjects.back();
    plugIn.retainedObjects.pop_back();
    objects.Release(object);
  }
}

}  // namespace varnel_kernel
