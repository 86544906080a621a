#include "varnel-kernel/Values.h"

#include <cstring>
#include <new>
#include <utility>

namespace varnel_kernel {
namespace {

// Reads the handle in a payload. Returns false if the payload has the wrong size.
template <class Handle>
bool ReadHandle(const void* bytes, uint32_t byteCount, Handle& handle) {
  if (byteCount != sizeof handle) return false;
  std::memcpy(&handle, bytes, sizeof handle);
  return true;
}

constexpr size_t RoundedUp(size_t size) noexcept {
  constexpr size_t kAlignment = alignof(std::max_align_t);
  return (size + kAlignment - 1) / kAlignment * kAlignment;
}

}  // namespace

std::unique_ptr<Data> Data::Create(VRKToken type, uint32_t byteCount) {
  const size_t size = RoundedUp(sizeof(Data)) + byteCount;
  if (size < byteCount) throw std::bad_alloc();  // overflow, on 32 bits
  void* const block = ::operator new(size);
  return std::unique_ptr<Data>(::new (block) Data(type, byteCount));
}

std::byte* Data::Bytes() noexcept {
  return reinterpret_cast<std::byte*>(this) + RoundedUp(sizeof(Data));
}

void Data::ReleaseReferences(Values& values) noexcept {
  values.Release<List>(list);
  values.Release<Dictionary>(dictionary);
}

void List::ReleaseReferences(Values& values) noexcept {
  for (const VRKData entry : entries) values.Release<Data>(entry);
}

void Dictionary::ReleaseReferences(Values& values) noexcept {
  for (const auto& [key, entry] : entries) values.Release<Data>(entry);
}

Values::Values(HandleTable& handleTable, TokenTable& tokenTable)
    : tokenType(tokenTable.TokenOf(kVRKTypeToken)),
      listType(tokenTable.TokenOf(kVRKTypeList)),
      dictionaryType(tokenTable.TokenOf(kVRKTypeDictionary)),
      handles(handleTable),
      tokens(tokenTable) {}

VRKResult Values::CreateData(VRKToken type, const void* bytes, uint32_t byteCount,
                             VRKData& outData) {
  if (!tokens.Holds(type)) return kVRKInvalidHandle;
  VRKToken token{};
  VRKList list{};
  VRKDictionary dictionary{};
  if (type == tokenType) {
    if (!ReadHandle(bytes, byteCount, token)) return kVRKInvalidArgument;
    if (!tokens.Holds(token)) return kVRKInvalidHandle;
  } else if (type == listType) {
    if (!ReadHandle(bytes, byteCount, list)) return kVRKInvalidArgument;
    if (handles.Find<List>(list) == nullptr) return kVRKInvalidHandle;
  } else if (type == dictionaryType) {
    if (!ReadHandle(bytes, byteCount, dictionary)) return kVRKInvalidArgument;
    if (handles.Find<Dictionary>(dictionary) == nullptr) return kVRKInvalidHandle;
  }
  std::unique_ptr<Data> data = Data::Create(type, byteCount);
  if (byteCount != 0) std::memcpy(data->Bytes(), bytes, byteCount);
  data->list = list;
  data->dictionary = dictionary;
  outData = handles.Add(std::move(data));
  Retain<List>(list);
  Retain<Dictionary>(dictionary);
  return kVRKNoError;
}

VRKResult Values::CreateDictionary(VRKDictionary& outDictionary) {
  outDictionary = handles.Add(std::make_unique<Dictionary>());
  return kVRKNoError;
}

VRKResult Values::GetEntry(VRKDictionary dictionary, VRKToken key, VRKData& outData) const {
  const Dictionary* const found = handles.Find<Dictionary>(dictionary);
  if (found == nullptr || !tokens.Holds(key)) return kVRKInvalidHandle;
  const auto entry = found->entries.find(static_cast<uint32_t>(key));
  if (entry == found->entries.end()) return kVRKNotFound;
  outData = entry->second;
  return kVRKNoError;
}

VRKResult Values::SetEntry(VRKDictionary dictionary, VRKToken key, VRKData data) {
  Dictionary* const found = handles.Find<Dictionary>(dictionary);
  if (found == nullptr || !tokens.Holds(key)) return kVRKInvalidHandle;
  if (handles.Find<Data>(data) == nullptr) return kVRKInvalidHandle;
  VRKData& entry = found->entries[static_cast<uint32_t>(key)];
  handles.Retain<Data>(data);
  const VRKData replaced = std::exchange(entry, data);
  Release<Data>(replaced);
  return kVRKNoError;
}

VRKResult Values::CreateKeyList(VRKDictionary dictionary, VRKList& outList) {
  const Dictionary* const found = handles.Find<Dictionary>(dictionary);
  if (found == nullptr) return kVRKInvalidHandle;
  VRKList list{};
  CreateList(list);
  try {
    std::vector<VRKData>& entries = handles.Find<List>(list)->entries;
    entries.reserve(found->entries.size());
    for (const auto& [key, entry] : found->entries) {
      VRKData keyData{};
      CreateData(tokenType, &key, sizeof key, keyData);
      entries.push_back(keyData);
    }
  } catch (...) {
    Release<List>(list);
    throw;
  }
  outList = list;
  return kVRKNoError;
}

VRKResult Values::CreateList(VRKList& outList) {
  outList = handles.Add(std::make_unique<List>());
  return kVRKNoError;
}

VRKResult Values::Append(VRKList list, VRKData data) {
  List* const found = handles.Find<List>(list);
  if (found == nullptr || handles.Find<Data>(data) == nullptr) return kVRKInvalidHandle;
  found->entries.push_back(data);
  handles.Retain<Data>(data);
  return kVRKNoError;
}

// Deferred destruction: values that lose their last reference while another is destroyed are
// queued, so nested values of any depth need no recursion.
void Values::DestroyDeferred(std::unique_ptr<Value> value) noexcept {
  value->nextPending = std::move(pendingDestruction);
  pendingDestruction = std::move(value);
  if (isDraining) return;
  isDraining = true;
  while (pendingDestruction != nullptr) {
    const std::unique_ptr<Value> buried = std::move(pendingDestruction);
    pendingDestruction = std::move(buried->nextPending);
    buried->ReleaseReferences(*this);
  }
  isDraining = false;
}

}  // namespace varnel_kernel
