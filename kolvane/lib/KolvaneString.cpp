#include "KolvaneString.h"

#include <algorithm>
#include <limits>

using tovali_private::ByteRunValue;

namespace tovali_private {

// What the bytes take for the room behind them to be aligned.
uint64_t ByteRunValue::AlignedSize(uint64_t byteCount) noexcept {
  constexpr uint64_t kAlignment = alignof(void*);
  return (sizeof(ByteRunValue) + byteCount + kAlignment - 1) / kAlignment * kAlignment - sizeof(ByteRunValue);
}

ByteRunValue* ByteRunValue::Create(uint64_t byteCount, size_t room) {
  const uint64_t size = sizeof(ByteRunValue) + AlignedSize(byteCount) + room;
  if (byteCount > std::numeric_limits<uint32_t>::max() || size > std::numeric_limits<size_t>::max()) {
    throw std::bad_alloc();
  }
  void* const block = ::operator new(static_cast<size_t>(size));
  return ::new (block) ByteRunValue(static_cast<uint32_t>(byteCount));
}

}  // namespace tovali_private

KolvaneString::KolvaneString(const uint16_t* units, uint32_t unitCount)
    : KolvaneString(ByteRunValue::Create(uint64_t{unitCount} * 2)) {
  std::copy_n(units, unitCount, reinterpret_cast<uint16_t*>(value->Data()));
}

KolvaneString::KolvaneString(const uint8_t* bytes, uint32_t byteCount)
    : KolvaneString(ByteRunValue::Create(byteCount)) {
  std::copy_n(bytes, byteCount, value->Data());
}

KolvaneString::KolvaneString(ByteRunValue* bytes) noexcept : value(bytes) {
  value->AddRef();
}

KolvaneString::KolvaneString(const KolvaneString& other) noexcept : KolvaneString(other.value) {}

KolvaneString& KolvaneString::operator=(const KolvaneString& other) noexcept {
  if (value == other.value) return *this;
  value->Release();
  value = other.value;
  value->AddRef();
  return *this;
}

KolvaneString::~KolvaneString() {
  value->Release();
}

const KolvaneString& KolvaneString::Empty() {
  static const KolvaneString empty(static_cast<const uint8_t*>(nullptr), 0);
  return empty;
}
