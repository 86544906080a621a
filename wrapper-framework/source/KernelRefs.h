// Owning handles of kernel data, lists, dictionaries and objects, with the kernel's operations on
// them. Throws: Exception with the kernel's code; outputs are then unchanged.
#pragma once

#include <cstdint>

#include "wrapper-framework/source/RefHandle.h"
#include "wrapper-framework/source/VarnelKernel.h"

namespace Varnel {

struct DataTraits {
  using Handle = VRKData;
  static VRKResult Retain(VRKData data) noexcept { return VRKDataRetain(data); }
  static VRKResult Release(VRKData data) noexcept { return VRKDataRelease(data); }
};

struct ListTraits {
  using Handle = VRKList;
  static VRKResult Retain(VRKList list) noexcept { return VRKListRetain(list); }
  static VRKResult Release(VRKList list) noexcept { return VRKListRelease(list); }
};

struct DictionaryTraits {
  using Handle = VRKDictionary;
  static VRKResult Retain(VRKDictionary dictionary) noexcept {
    return VRKDictionaryRetain(dictionary);
  }
  static VRKResult Release(VRKDictionary dictionary) noexcept {
    return VRKDictionaryRelease(dictionary);
  }
};

struct ObjectTraits {
  using Handle = VRKObject;
  static VRKResult Retain(VRKObject object) noexcept { return VRKObjectRetain(object); }
  static VRKResult Release(VRKObject object) noexcept { return VRKObjectRelease(object); }
};

class DataRef : public RefHandle<DataTraits> {
 public:
  using RefHandle::RefHandle;

  // Replaces the handle by one of new data with a copy of the bytes.
  void Create(VRKToken type, const void* bytes, uint32_t byteCount);

  // Stores the coerced data in `target`, which may be this object. Returns false and leaves
  // `target` unchanged if the coercion is impossible.
  bool Coerce(VRKToken toType, DataRef& target) const;
};

class ListRef : public RefHandle<ListTraits> {
 public:
  using RefHandle::RefHandle;

  uint32_t GetSize() const;
  DataRef GetEntry(uint32_t index) const;
};

class DictionaryRef : public RefHandle<DictionaryTraits> {
 public:
  using RefHandle::RefHandle;

  // Replaces the handle by one of a new, empty dictionary.
  void Create();

  void SetEntry(VRKToken key, const DataRef& data) const;
  DataRef GetEntry(VRKToken key) const;
  ListRef CreateKeyList() const;
};

class ObjectRef : public RefHandle<ObjectTraits> {
 public:
  using RefHandle::RefHandle;

  // Replaces the handle by one of a new object of the class. `parameters` may be null.
  void Create(VRKToken objectClass, VRKDictionary parameters);
};

// Returns whether a handler took the message. Results are in `parameters` afterwards. The kernel's
// flag is 0 if `clearFlag` is true, else 1. Throws: Exception with a handler's failure code.
bool DeliverMessage(VRKObject object, VRKToken message, const DictionaryRef& parameters,
                    bool clearFlag);

}  // namespace Varnel
