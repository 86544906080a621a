// The operations of VarnelKernel.h. They check pointers for null and forward to the kernel's parts,
// which check handles.
#include "wrapper-framework/source/VarnelKernel.h"

#include <cstdlib>

#include "varnel-kernel/Kernel.h"

using varnel_kernel::Data;
using varnel_kernel::Dictionary;
using varnel_kernel::Kernel;
using varnel_kernel::List;
using varnel_kernel::RunTraced;
using varnel_kernel::Serve;

namespace {

template <class Counted>
VRKResult Retain(const char* operation, typename Counted::Handle handle) noexcept {
  return Serve(
      operation, [=](Kernel& kernel) { return kernel.values.Retain<Counted>(handle); }, handle);
}

template <class Counted>
VRKResult Release(const char* operation, typename Counted::Handle handle) noexcept {
  return Serve(
      operation, [=](Kernel& kernel) { return kernel.values.Release<Counted>(handle); }, handle);
}

}  // namespace

VRKResult VRKObjectCreate(VRKToken objectClass, VRKDictionary parameters, VRKObject* outObject) {
  return Serve(
      "VRKObjectCreate",
      [=](Kernel& kernel) -> VRKResult {
        if (outObject == nullptr) return kVRKInvalidArgument;
        if (!kernel.values.IsNullOrLive(parameters)) return kVRKInvalidHandle;
        return kernel.plugIns.CreateObject(objectClass, parameters, *outObject);
      },
      objectClass, parameters, outObject);
}

VRKResult VRKObjectDeliverMessage(VRKObject object, VRKToken message, VRKDictionary parameters,
                                  uint32_t flags) {
  return Serve(
      "VRKObjectDeliverMessage",
      [=](Kernel& kernel) -> VRKResult {
        if (!kernel.values.IsNullOrLive(parameters)) return kVRKInvalidHandle;
        return kernel.objects.Deliver(object, message, parameters);
      },
      object, message, parameters, flags);
}

VRKResult VRKObjectRetain(VRKObject object) {
  return Serve(
      "VRKObjectRetain", [=](Kernel& kernel) { return kernel.objects.Retain(object); }, object);
}

VRKResult VRKObjectRelease(VRKObject object) {
  return Serve(
      "VRKObjectRelease", [=](Kernel& kernel) { return kernel.objects.Release(object); }, object);
}

VRKResult VRKObjectFactoryRegister(VRKToken objectClass, uint32_t reserved,
                                   VRKObjectFactoryCallback callback, void* context) {
  return Serve(
      "VRKObjectFactoryRegister",
      [=](Kernel& kernel) -> VRKResult {
        if (callback == nullptr) return kVRKInvalidArgument;
        return kernel.objects.Register(objectClass, {callback, context});
      },
      objectClass, reserved, callback, context);
}

VRKResult VRKObjectFactoryUnregister(uint32_t reserved, VRKObjectFactoryCallback callback,
                                     void* context) {
  return Serve(
      "VRKObjectFactoryUnregister",
      [=](Kernel& kernel) -> VRKResult {
        return kernel.objects.Unregister({callback, context});
      },
      reserved, callback, context);
}

VRKResult VRKMessageHandlerInstall(VRKObject object, uint32_t reserved1,
                                   VRKMessageHandlerCallback callback, void* context,
                                   uint32_t reserved2, uint32_t reserved3,
                                   VRKMessageHandler* outRegistration) {
  return Serve(
      "VRKMessageHandlerInstall",
      [=](Kernel& kernel) -> VRKResult {
        if (callback == nullptr || outRegistration == nullptr) return kVRKInvalidArgument;
        return kernel.objects.Install(object, {callback, context}, *outRegistration);
      },
      object, reserved1, callback, context, reserved2, reserved3, outRegistration);
}

VRKResult VRKMessageHandlerAddMessages(VRKMessageHandler registration, const VRKToken* messages,
                                       uint32_t count) {
  return Serve(
      "VRKMessageHandlerAddMessages",
      [=](Kernel& kernel) -> VRKResult {
        if (messages == nullptr && count != 0) return kVRKInvalidArgument;
        return kernel.objects.AddMessages(registration, messages, count);
      },
      registration, messages, count);
}

VRKResult VRKMessageHandlerRemove(VRKMessageHandler registration, VRKObject object) {
  return Serve(
      "VRKMessageHandlerRemove",
      [=](Kernel& kernel) -> VRKResult { return kernel.objects.Remove(registration, object); },
      registration, object);
}

VRKResult VRKTokenCreate(const char* text, uint32_t flag, VRKToken* outToken) {
  return Serve(
      "VRKTokenCreate",
      [=](Kernel& kernel) -> VRKResult {
        if (text == nullptr || outToken == nullptr) return kVRKInvalidArgument;
        *outToken = kernel.tokens.TokenOf(text);
        return kVRKNoError;
      },
      text, flag, outToken);
}

VRKResult VRKDataCreate(VRKToken type, const void* bytes, uint32_t byteCount, uint32_t reserved,
                        VRKData* outData) {
  return Serve(
      "VRKDataCreate",
      [=](Kernel& kernel) -> VRKResult {
        if (outData == nullptr || (bytes == nullptr && byteCount != 0)) return kVRKInvalidArgument;
        return kernel.values.CreateData(type, bytes, byteCount, *outData);
      },
      type, bytes, byteCount, reserved, outData);
}

VRKResult VRKDataGetData(VRKData data, const void** outBytes, uint32_t* outByteCount,
                         VRKToken* outType) {
  return Serve(
      "VRKDataGetData",
      [=](Kernel& kernel) -> VRKResult {
        Data* const found = kernel.handles.Find<Data>(data);
        if (found == nullptr) return kVRKInvalidHandle;
        if (outBytes != nullptr) *outBytes = found->byteCount != 0 ? found->Bytes() : nullptr;
        if (outByteCount != nullptr) *outByteCount = found->byteCount;
        if (outType != nullptr) *outType = found->type;
        return kVRKNoError;
      },
      data, outBytes, outByteCount, outType);
}

VRKResult VRKDataCoerce(VRKData data, VRKToken toType, VRKData* outData) {
  return Serve(
      "VRKDataCoerce",
      [=](Kernel& kernel) -> VRKResult {
        if (outData == nullptr) return kVRKInvalidArgument;
        return kernel.coercions.Coerce(data, toType, *outData);
      },
      data, toType, outData);
}

VRKResult VRKDataRetain(VRKData data) {
  return Retain<Data>("VRKDataRetain", data);
}

VRKResult VRKDataRelease(VRKData data) {
  return Release<Data>("VRKDataRelease", data);
}

VRKResult VRKDataCoercionHandlerInstall(VRKToken fromType, VRKToken toType, uint32_t reserved,
                                        VRKDataCoercionCallback callback, void* context) {
  return Serve(
      "VRKDataCoercionHandlerInstall",
      [=](Kernel& kernel) -> VRKResult {
        if (callback == nullptr) return kVRKInvalidArgument;
        return kernel.coercions.Install(fromType, toType, {callback, context});
      },
      fromType, toType, reserved, callback, context);
}

VRKResult VRKDataCoercionHandlerRemove(VRKDataCoercionCallback callback, void* context,
                                       uint32_t reserved1, uint32_t reserved2) {
  return Serve(
      "VRKDataCoercionHandlerRemove",
      [=](Kernel& kernel) -> VRKResult {
        return kernel.coercions.Remove({callback, context});
      },
      callback, context, reserved1, reserved2);
}

VRKResult VRKDictionaryCreate(uint32_t reserved, VRKDictionary* outDictionary) {
  return Serve(
      "VRKDictionaryCreate",
      [=](Kernel& kernel) -> VRKResult {
        if (outDictionary == nullptr) return kVRKInvalidArgument;
        return kernel.values.CreateDictionary(*outDictionary);
      },
      reserved, outDictionary);
}

VRKResult VRKDictionaryGetEntry(VRKDictionary dictionary, VRKToken key, VRKData* outData) {
  return Serve(
      "VRKDictionaryGetEntry",
      [=](Kernel& kernel) -> VRKResult {
        if (outData == nullptr) return kVRKInvalidArgument;
        return kernel.values.GetEntry(dictionary, key, *outData);
      },
      dictionary, key, outData);
}

VRKResult VRKDictionarySetEntry(VRKDictionary dictionary, VRKToken key, VRKData data) {
  return Serve(
      "VRKDictionarySetEntry",
      [=](Kernel& kernel) -> VRKResult { return kernel.values.SetEntry(dictionary, key, data); },
      dictionary, key, data);
}

VRKResult VRKDictionaryCreateKeyList(VRKDictionary dictionary, VRKList* outList) {
  return Serve(
      "VRKDictionaryCreateKeyList",
      [=](Kernel& kernel) -> VRKResult {
        if (outList == nullptr) return kVRKInvalidArgument;
        return kernel.values.CreateKeyList(dictionary, *outList);
      },
      dictionary, outList);
}

VRKResult VRKDictionaryRetain(VRKDictionary dictionary) {
  return Retain<Dictionary>("VRKDictionaryRetain", dictionary);
}

VRKResult VRKDictionaryRelease(VRKDictionary dictionary) {
  return Release<Dictionary>("VRKDictionaryRelease", dictionary);
}

VRKResult VRKListGetSize(VRKList list, uint32_t* outSize) {
  return Serve(
      "VRKListGetSize",
      [=](Kernel& kernel) -> VRKResult {
        const List* const found = kernel.handles.Find<List>(list);
        if (found == nullptr) return kVRKInvalidHandle;
        if (outSize == nullptr) return kVRKInvalidArgument;
        *outSize = static_cast<uint32_t>(found->entries.size());
        return kVRKNoError;
      },
      list, outSize);
}

VRKResult VRKListGetEntry(VRKList list, uint32_t index, VRKData* outData) {
  return Serve(
      "VRKListGetEntry",
      [=](Kernel& kernel) -> VRKResult {
        const List* const found = kernel.handles.Find<List>(list);
        if (found == nullptr) return kVRKInvalidHandle;
        if (outData == nullptr) return kVRKInvalidArgument;
        if (index >= found->entries.size()) return kVRKNotFound;
        *outData = found->entries[index];
        return kVRKNoError;
      },
      list, index, outData);
}

VRKResult VRKListRetain(VRKList list) {
  return Retain<List>("VRKListRetain", list);
}

VRKResult VRKListRelease(VRKList list) {
  return Release<List>("VRKListRelease", list);
}

VRKResult VRKMemoryAllocate(uint32_t byteCount, uint32_t reserved, void** outBlock) {
  return Serve(
      "VRKMemoryAllocate",
      [=](Kernel& kernel) -> VRKResult {
        if (outBlock == nullptr) return kVRKInvalidArgument;
        void* const block = std::malloc(byteCount != 0 ? byteCount : 1);
        if (block == nullptr) return kVRKOutOfMemory;
        ++kernel.memoryBlocks;
        *outBlock = block;
        return kVRKNoError;
      },
      byteCount, reserved, outBlock);
}

const char* VRKTokenGetString(VRKToken token) {
  const std::lock_guard lock(Kernel::mutex);
  const Kernel* const kernel = Kernel::Running();
  return kernel != nullptr ? kernel->tokens.TextOf(token) : nullptr;
}

// Runs on a kernel that was shut down, too: blocks may be deallocated after it has ended.
VRKResult VRKMemoryDeallocate(void* block) {
  const std::lock_guard lock(Kernel::mutex);
  const auto deallocate = [=](Kernel& kernel) -> VRKResult {
    if (block == nullptr) return kVRKNoError;
    --kernel.memoryBlocks;
    std::free(block);
    return kVRKNoError;
  };
  return RunTraced(Kernel::built, "VRKMemoryDeallocate", deallocate, block);
}

uint32_t VRKRuntimeError(uint32_t severity, const char* domain, const char* expression,
                         uint32_t reserved, const char* sourceFile, uint32_t line,
                         const char* function, uint32_t* onceFlag) {
  uint32_t answer = 0;
  const auto report = [&](Kernel& kernel) -> VRKResult {
    answer =
        kernel.reports.Report(severity, domain, expression, sourceFile, line, function, onceFlag);
    return kVRKNoError;
  };
  Serve("VRKRuntimeError", report, severity, domain, expression, reserved, sourceFile, line,
        function, onceFlag);
  return answer;
}
