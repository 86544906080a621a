// Data, lists and dictionaries.
#pragma once

#include <boost/unordered/unordered_flat_map.hpp>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "varnel-kernel/HandleTable.h"
#include "varnel-kernel/TokenTable.h"
#include "wrapper-framework/source/VarnelKernel.h"

namespace varnel_kernel {

class Values;

// The base of reference-counted items, which may hold references to other values.
struct Value : Item {
  virtual void ReleaseReferences(Values& values) noexcept = 0;

  std::unique_ptr<Value> nextPending;  // link in the list of values that wait for their destruction
};

// Typed bytes, stored directly after the object, aligned for any type.
struct Data final : Value {
  using Handle = VRKData;
  static constexpr Kind kKind = Kind::kData;

  // The bytes are uninitialised. Throws: std::bad_alloc.
  static std::unique_ptr<Data> Create(VRKToken type, uint32_t byteCount);
  static void operator delete(void* block) { ::operator delete(block); }

  std::byte* Bytes() noexcept;
  void ReleaseReferences(Values& values) noexcept override;

  const VRKToken type;
  const uint32_t byteCount;
  VRKList list{};  // set in data of a list or dictionary, which holds a reference to it
  VRKDictionary dictionary{};

 private:
  Data(VRKToken dataType, uint32_t count) : type(dataType), byteCount(count) {}
};

struct List final : Value {
  using Handle = VRKList;
  static constexpr Kind kKind = Kind::kList;

  void ReleaseReferences(Values& values) noexcept override;

  std::vector<VRKData> entries;  // a reference to each
};

struct Dictionary final : Value {
  using Handle = VRKDictionary;
  static constexpr Kind kKind = Kind::kDictionary;

  void ReleaseReferences(Values& values) noexcept override;

  boost::unordered_flat_map<uint32_t, VRKData> entries;  // by token; a reference to each
};

// Handles may be any 32 bits. Requires: outs are not null. Throws: std::bad_alloc; nothing has
// changed then.
class Values {
 public:
  Values(HandleTable& handleTable, TokenTable& tokenTable);

  VRKResult CreateData(VRKToken type, const void* bytes, uint32_t byteCount, VRKData& outData);
  VRKResult CreateDictionary(VRKDictionary& outDictionary);
  VRKResult GetEntry(VRKDictionary dictionary, VRKToken key, VRKData& outData) const;
  VRKResult SetEntry(VRKDictionary dictionary, VRKToken key, VRKData data);
  VRKResult CreateKeyList(VRKDictionary dictionary, VRKList& outList);
  VRKResult CreateList(VRKList& outList);
  VRKResult Append(VRKList list, VRKData data);

  bool IsNullOrLive(VRKDictionary dictionary) const noexcept {
    return dictionary == VRKDictionary{} || handles.Find<Dictionary>(dictionary) != nullptr;
  }

  template <class Counted>
  VRKResult Retain(typename Counted::Handle handle) noexcept {
    if (handle == typename Counted::Handle{}) return kVRKNoError;
    return handles.Retain<Counted>(handle) ? kVRKNoError : kVRKInvalidHandle;
  }

  template <class Counted>
  VRKResult Release(typename Counted::Handle handle) noexcept {
    if (handle == typename Counted::Handle{}) return kVRKNoError;
    if (handles.Find<Counted>(handle) == nullptr) return kVRKInvalidHandle;
    if (handles.Release<Counted>(handle) == 0) DestroyDeferred(handles.Remove<Counted>(handle));
    return kVRKNoError;
  }

  const VRKToken tokenType;
  const VRKToken listType;
  const VRKToken dictionaryType;

 private:
  void DestroyDeferred(std::unique_ptr<Value> value) noexcept;

  HandleTable& handles;
  TokenTable& tokens;
  std::unique_ptr<Value> pendingDestruction;
  bool isDraining = false;
};

}  // namespace varnel_kernel
