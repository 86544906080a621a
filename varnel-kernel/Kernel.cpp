#include "varnel-kernel/Kernel.h"

namespace varnel_kernel {

VRKResult Kernel::Start() {
  if (Running() != nullptr) return kVRKAlreadyExists;
  if (built == nullptr) built = new Kernel;
  built->isRunning = true;
  return kVRKNoError;
}

VRKResult Kernel::ShutDown(VRKHostLiveCounts* outLive) noexcept {
  if (innermostCode != nullptr) return kVRKInUse;
  if (outLive != nullptr) *outLive = LiveCounts();
  isRunning = false;
  objects.Clear();
  coercions.Clear();
  handles.Clear();
  trace.Set(nullptr, nullptr);
  reports.Set(nullptr, nullptr);
  return kVRKNoError;
}

VRKHostLiveCounts Kernel::LiveCounts() const noexcept {
  VRKHostLiveCounts counts{};
  counts.objects = handles.Live(Kind::kObject);
  counts.messageHandlers = handles.Live(Kind::kMessageHandler);
  counts.objectFactories = static_cast<uint32_t>(objects.Factories().size());
  counts.dataCoercions = static_cast<uint32_t>(coercions.Installed().size());
  counts.data = handles.Live(Kind::kData);
  counts.lists = handles.Live(Kind::kList);
  counts.dictionaries = handles.Live(Kind::kDictionary);
  counts.memoryBlocks = memoryBlocks;
  counts.plugIns = handles.Live(Kind::kPlugIn);
  return counts;
}

}  // namespace varnel_kernel
