// Holders of kernel data, lists, dictionaries and objects, with the kernel's operations on them.
// Each throws the kernel's code as an Exception, and leaves what it would have replaced.
#pragma once

#include <cstdint>

#include "HandleHolder.h"
#include "VarnelKernel.h"

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

class DataRef : public HandleHolder<DataTraits> {
 public:
  using HandleHolder::HandleHolder;

  // Becomes new data with a copy of the bytes.
  void Create(VRKToken type, const void* bytes, uint32_t byteCount);

  // Puts this data, as data of another type, into `target`, which may be this holder itself. False,
  // and `target` left alone, when that is impossible.
  bool Coerce(VRKToken toType, DataRef& target) const;
};

class ListRef : public HandleHolder<ListTraits> {
 public:
  using HandleHolder::HandleHolder;

  uint32_t GetSize() const;
  DataRef GetEntry(uint32_t index) const;
};

class DictionaryRef : public HandleHolder<DictionaryTraits> {
 public:
  using HandleHolder::HandleHolder;

  // Becomes a new, empty dictionary.
  void Create();

  void SetEntry(VRKToken key, const DataRef& data) const;
  DataRef GetEntry(VRKToken key) const;
  ListRef CreateKeyList() const;
};

class ObjectRef : public HandleHolder<ObjectTraits> {
 public:
  using HandleHolder::HandleHolder;

  // Becomes a new object of the class. `parameters` may be null.
  void Create(VRKToken objectClass, VRKDictionary parameters);
};

// Returns whether a handler took the message, and throws what a handler failed with. Results are in
// the parameters afterwards. The kernel's flag is 0 for a true `clearFlag`, else 1.
bool DeliverMessage(VRKObject object, VRKToken message, const DictionaryRef& parameters,
                    bool clearFlag);

}  // namespace Varnel
