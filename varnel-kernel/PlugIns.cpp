#include "PlugIns.h"

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
const void* ModuleOf(Function function) noexcept {
  return platform::ModuleOf(reinterpret_cast<const void*>(function));
}

}  // namespace

PlugIns::PlugIns(HandleTable& handleTable, Objects& objectStore, Coercions& coercionStore,
                 RunningCode*& innermostCode)
    : handles(handleTable),
      objects(objectStore),
      coercions(coercionStore),
      running(innermostCode) {}

VRKResult PlugIns::Load(const char* path, const char* prefix, VRKPlugIn& outPlugIn,
                        std::string& reason) {
  using Library = std::unique_ptr<void, decltype(&platform::UnloadSharedLibrary)>;
  const std::string name = prefix;
  auto plugIn = std::make_unique<PlugIn>();
  Library library(platform::LoadSharedLibrary(path, reason), &platform::UnloadSharedLibrary);
  if (library == nullptr) return kVRKNotFound;
  const bool complete =
      FindEntryPoint(library.get(), name + "Initialize", plugIn->initialize, reason) &&
      FindEntryPoint(library.get(), name + "Terminate", plugIn->terminate, reason) &&
      FindEntryPoint(library.get(), name + "Version", plugIn->version, reason);
  if (!complete) return kVRKNotFound;
  plugIn->library = library.get();
  outPlugIn = handles.Add(std::move(plugIn));
  static_cast<void>(library.release());
  return kVRKNoError;
}

VRKResult PlugIns::Initialize(VRKPlugIn plugIn) {
  PlugIn* const found = handles.Find<PlugIn>(plugIn);
  if (found == nullptr) return kVRKInvalidHandle;
  const RunningCode code(running, found->initialize);
  PlugIn* const outer = std::exchange(initialising, found);
  const VRKResult result = found->initialize(0);
  initialising = outer;
  return result;
}

VRKResult PlugIns::Terminate(VRKPlugIn plugIn) {
  PlugIn* const found = handles.Find<PlugIn>(plugIn);
  if (found == nullptr) return kVRKInvalidHandle;
  const RunningCode code(running, found->terminate);
  const VRKResult result = found->terminate(0);
  ReleaseKept(*found, 0);
  return result;
}

VRKResult PlugIns::Version(VRKPlugIn plugIn, uint32_t& outVersion) {
  const PlugIn* const found = handles.Find<PlugIn>(plugIn);
  if (found == nullptr) return kVRKInvalidHandle;
  const RunningCode code(running, found->version);
  outVersion = found->version();
  return kVRKNoError;
}

// What makes objects and data would be missed by those whose objects are kept, so it is looked for
// first. Kept objects are released before their handlers are looked for, which may end with them.
VRKResult PlugIns::Unload(VRKPlugIn plugIn) {
  PlugIn* const found = handles.Find<PlugIn>(plugIn);
  if (found == nullptr) return kVRKInvalidHandle;
  const void* const module = ModuleOf(found->initialize);
  if (IsRunning(module) || MakesThings(module)) return kVRKInUse;
  ReleaseKept(*found, 0);
  if (HandlesMessages(module)) return kVRKInUse;
  const platform::SharedLibrary library = found->library;
  handles.Remove<PlugIn>(plugIn);
  platform::UnloadSharedLibrary(library);
  return kVRKNoError;
}

// What a factory made on the way to an object that it then failed to make is not kept.
VRKResult PlugIns::CreateObject(VRKToken objectClass, VRKDictionary parameters,
                                VRKObject& outObject) {
  PlugIn* const keeper = initialising;
  if (keeper == nullptr) return objects.Create(objectClass, parameters, outObject);
  const size_t keptBefore = keeper->kept.size();
  VRKObject object{};
  const VRKResult result = objects.Create(objectClass, parameters, object);
  if (result != kVRKNoError) {
    ReleaseKept(*keeper, keptBefore);
    return result;
  }
  Keep(object);
  outObject = object;
  return kVRKNoError;
}

bool PlugIns::IsRunning(const void* module) const noexcept {
  for (const RunningCode* code = running; code != nullptr; code = code->Outer()) {
    if (platform::ModuleOf(code->Address()) == module) return true;
  }
  return false;
}

bool PlugIns::MakesThings(const void* module) const noexcept {
  const auto isIn = [&](const auto& each) { return ModuleOf(each.callback.function) == module; };
  const auto& factories = objects.Factories();
  const auto& installed = coercions.Installed();
  return std::any_of(factories.begin(), factories.end(), isIn) ||
         std::any_of(installed.begin(), installed.end(), isIn);
}

bool PlugIns::HandlesMessages(const void* module) const noexcept {
  bool any = false;
  handles.ForEach<MessageHandler>([&](VRKMessageHandler, const MessageHandler& handler) {
    any = any || ModuleOf(handler.callback.function) == module;
  });
  return any;
}

void PlugIns::Keep(VRKObject object) {
  try {
    initialising->kept.push_back(object);
  } catch (...) {
    objects.Release(object);
    throw;
  }
  objects.Retain(object);
}

void PlugIns::ReleaseKept(PlugIn& plugIn, size_t from) {
  while (plugIn.kept.size() > from) {
    const VRKObject object = plugIn.kept.back();
    plugIn.kept.pop_back();
    objects.Release(object);
  }
}

}  // namespace varnel_kernel
