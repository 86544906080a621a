// Plug-ins: libraries that the host loads into the kernel.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "platform/SharedLibrary.h"
#include "varnel-kernel/Callbacks.h"
#include "varnel-kernel/Coercions.h"
#include "varnel-kernel/ErrorReports.h"
#include "varnel-kernel/HandleTable.h"
#include "varnel-kernel/Objects.h"
#include "varnel-kernel/Trace.h"
#include "varnel-kernel/VarnelKernelHost.h"

namespace varnel_kernel {

struct PlugIn final : Item {
  using Handle = VRKPlugIn;
  static constexpr Kind kKind = Kind::kPlugIn;

  platform::SharedLibrary library;
  platform::AddressRange addresses;  // the library's
  VRKResult(VRK_CALL* initialize)(uint32_t reserved);
  VRKResult(VRK_CALL* terminate)(uint32_t reserved);
  uint32_t(VRK_CALL* version)();
  std::vector<VRKObject>
      retainedObjects;  // owned references to the objects created while it initialised
};

// Looks up the entry points of a loaded library, which the caller still owns. Returns null and sets
// `reason` if one is missing. Requires: the kernel's lock is not held, because the lookup takes the
// system's loader lock. Throws: std::bad_alloc.
std::unique_ptr<PlugIn> FindPlugIn(platform::SharedLibrary library, const char* prefix,
                                   std::string& reason);

// Handles may be any 32 bits. Requires: outs are not null.
class PlugIns {
 public:
  PlugIns(HandleTable& handleTable, Objects& objectStore, Coercions& coercionStore,
          const Trace& hostTrace, const ErrorReports& hostReports, ActiveCallback*& innermostCode);

  VRKPlugIn Add(std::unique_ptr<PlugIn> plugIn);
  VRKResult Initialize(VRKPlugIn plugIn);
  VRKResult Terminate(VRKPlugIn plugIn);
  VRKResult Version(VRKPlugIn plugIn, uint32_t& outVersion);

  // Removes the plug-in. The caller then unloads its library, without the kernel's lock.
  VRKResult Remove(VRKPlugIn plugIn, platform::SharedLibrary& outLibrary);

  // Whether a library that was refused as a plug-in must stay loaded: its code is running or
  // installed as a callback, and no plug-in keeps it loaded.
  bool MustStay(platform::SharedLibrary library,
                const platform::AddressRange& addresses) const noexcept;

  // Objects::Create, and retains the object for the plug-in that is being initialised, if any.
  VRKResult CreateObject(VRKToken objectClass, VRKDictionary parameters, VRKObject& outObject);

 private:
  bool IsRunning(const platform::AddressRange& code) const noexcept;
  bool HasRegistrations(const platform::AddressRange& code) const noexcept;
  bool HandlesMessages(const platform::AddressRange& code) const noexcept;

  void ReleaseRetained(PlugIn& plugIn, size_t from);

  HandleTable& handles;
  Objects& objects;
  Coercions& coercions;
  const Trace& trace;
  const ErrorReports& reports;
  ActiveCallback*& running;
  PlugIn* initialising = nullptr;
};

}  // namespace varnel_kernel
