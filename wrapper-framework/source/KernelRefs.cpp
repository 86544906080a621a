#include "wrapper-framework/source/KernelRefs.h"

#include "wrapper-framework/source/ResultCodes.h"

namespace Varnel {

void DataRef::Create(VRKToken type, const void* bytes, uint32_t byteCount) {
  VRKData created{};
  ThrowIfFailed(VRKDataCreate(type, bytes, byteCount, 0, &created));
  Adopt(created);
}

bool DataRef::Coerce(VRKToken toType, DataRef& target) const {
  VRKData coerced{};
  const VRKResult result = VRKDataCoerce(Get(), toType, &coerced);
  if (result == kResultCannotCoerce) return false;
  ThrowIfFailed(result);
  target.Adopt(coerced);
  return true;
}

uint32_t ListRef::GetSize() const {
  uint32_t size = 0;
  ThrowIfFailed(VRKListGetSize(Get(), &size));
  return size;
}

DataRef ListRef::GetEntry(uint32_t index) const {
  VRKData borrowed{};
  ThrowIfFailed(VRKListGetEntry(Get(), index, &borrowed));
  return DataRef(borrowed);
}

void DictionaryRef::Create() {
  VRKDictionary created{};
  ThrowIfFailed(VRKDictionaryCreate(0, &created));
  Adopt(created);
}

void DictionaryRef::SetEntry(VRKToken key, const DataRef& data) const {
  ThrowIfFailed(VRKDictionarySetEntry(Get(), key, data.Get()));
}

DataRef DictionaryRef::GetEntry(VRKToken key) const {
  VRKData borrowed{};
  ThrowIfFailed(VRKDictionaryGetEntry(Get(), key, &borrowed));
  return DataRef(borrowed);
}

ListRef DictionaryRef::CreateKeyList() const {
  VRKList created{};
  ThrowIfFailed(VRKDictionaryCreateKeyList(Get(), &created));
  ListRef keys;
  keys.Adopt(created);
  return keys;
}

void ObjectRef::Create(VRKToken objectClass, VRKDictionary parameters) {
  VRKObject created{};
  ThrowIfFailed(VRKObjectCreate(objectClass, parameters, &created));
  Adopt(created);
}

bool DeliverMessage(VRKObject object, VRKToken message, const DictionaryRef& parameters,
                    bool clearFlag) {
  const VRKResult result =
      VRKObjectDeliverMessage(object, message, parameters.Get(), clearFlag ? 0 : 1);
  if (result == kResultNotHandled) return false;
  ThrowIfFailed(result);
  return true;
}

}  // namespace Varnel
