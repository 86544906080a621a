// The libraries that extend the kernel.
#pragma once

#include <memory>
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
  platform::AddressRange addresses;  // the library's
  VRKResult(VRK_CALL* initialize)(uint32_t reserved);
  VRKResult(VRK_CALL* terminate)(uint32_t reserved);
  uint32_t(VRK_CALL* version)();
  std::vector<VRKObject> kept;  // a reference to each object that came into being at initialisation
};

// Looks up the entry points of a loaded library, which stays the caller's. Null if one is missing;
// `reason` then names it. Throws std::bad_alloc. Asks the system's loader, so the kernel's lock
// must not be held.
std::unique_ptr<PlugIn> FindPlugIn(platform::SharedLibrary library, const char* prefix,
                                   std::string& reason);

// The operations on them. Handles may be any 32 bits; outs are not null.
class PlugIns {
 public:
  PlugIns(HandleTable& handleTable, Objects& objectStore, Coercions& coercionStore,
          const Trace& hostTrace, const ErrorReports& hostReports, RunningCode*& innermostCode);

  VRKPlugIn Add(std::unique_ptr<PlugIn> plugIn);
  VRKResult Initialize(VRKPlugIn plugIn);
  VRKResult Terminate(VRKPlugIn plugIn);
  VRKResult Version(VRKPlugIn plugIn, uint32_t& outVersion);

  // Ends the plug-in, whose library is then to be unloaded.
  VRKResult Remove(VRKPlugIn plugIn, platform::SharedLibrary& outLibrary);

  // Whether a library that did not become a plug-in must stay loaded: its code runs, or is
  // installed as a callback, and no plug-in keeps it loaded.
  bool MustStay(platform::SharedLibrary library,
                const platform::AddressRange& addresses) const noexcept;

  // Objects::Create, and keeps the object for the plug-in that is being initialised, if one is.
  VRKResult CreateObject(VRKToken objectClass, VRKDictionary parameters, VRKObject& outObject);

 private:
  bool IsRunning(const platform::AddressRange& code) const noexcept;
  bool ServesOthers(const platform::AddressRange& code) const noexcept;
  bool HandlesMessages(const platform::AddressRange& code) const noexcept;

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
