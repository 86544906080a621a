// The libraries that extend the kernel.
#pragma once

#include <string>
#include <vector>

#include "Callbacks.h"
#include "Coercions.h"
#include "ErrorReports.h"
#include "HandleTable.h"
#include "Objects.h"
#include "SharedLibrary.h"
#include "Trace.h"
#include "VarnelKernelHost.h"

namespace varnel_kernel {

struct PlugIn final : Item {
  using Handle = VRKPlugIn;
  static constexpr Kind kKind = Kind::kPlugIn;

  platform::SharedLibrary library;
  VRKResult(VRK_CALL* initialize)(uint32_t reserved);
  VRKResult(VRK_CALL* terminate)(uint32_t reserved);
  uint32_t(VRK_CALL* version)();
  std::vector<VRKObject> kept;  // a reference to each object that came into being at initialisation
};

// The operations on them. Handles may be any 32 bits; outs are not null.
class PlugIns {
 public:
  PlugIns(HandleTable& handleTable, Objects& objectStore, Coercions& coercionStore,
          const Trace& hostTrace, const ErrorReports& hostReports, RunningCode*& innermostCode);

  // Makes a plug-in of a loaded library. On kVRKNotFound `reason` says why.
  VRKResult Add(platform::SharedLibrary library, const char* prefix, VRKPlugIn& outPlugIn,
                std::string& reason);
  VRKResult Initialize(VRKPlugIn plugIn);
  VRKResult Terminate(VRKPlugIn plugIn);
  VRKResult Version(VRKPlugIn plugIn, uint32_t& outVersion);

  // Ends the plug-in, whose library is then to be unloaded.
  VRKResult Remove(VRKPlugIn plugIn, platform::SharedLibrary& outLibrary);

  // How many handlers, factories and coercions there are.
  uint32_t InstalledCount() const noexcept;

  // Objects::Create, and keeps the object for the plug-in that is being initialised, if one is.
  VRKResult CreateObject(VRKToken objectClass, VRKDictionary parameters, VRKObject& outObject);

 private:
  bool IsRunning(const void* module) const noexcept;
  bool ServesOthers(const void* module) const noexcept;
  bool HandlesMessages(const void* module) const noexcept;

  void ReleaseKept(PlugIn& plugIn, size_t from);

  HandleTable& handles;
  Objects& objects;
  Coercions& coercions;
  const Trace& trace;
  const ErrorReports& reports;
  RunningCode*& running;
  PlugIn* initialising = nullptr;
};

}  // namespace varnel_kernel
