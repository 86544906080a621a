#include "kolvane/lib/KolvaneString.h"

#include <algorithm>
#include <limits>
#include <new>

using tovali_private::ByteRunValue;

namespace tovali_private {

ByteRunValue* ByteRunValue::Create(const uint8_t* bytes, uint32_t byteCount) {
  const uint64_t size = uint64_t{sizeof(ByteRunValue)} + byteCount;
  if (size > std::numeric_limits<size_t>::max()) throw std::bad_alloc();
  void* const block = ::operator new(static_cast<size_t>(size));
  std::copy_n(bytes, byteCount, static_cast<uint8_t*>(block) + sizeof(ByteRunValue));
  return ::new (block) ByteRunValue(byteCount, sizeof(ByteRunValue));
}

}  // namespace tovali_private

namespace {

uint32_t ByteCount(uint32_t unitCount) {
  if (unitCount > std::numeric_limits<uint32_t>::max() / 2) throw std::bad_alloc();
  return unitCount * 2;
}

}  // namespace

KolvaneString::KolvaneString(const uint16_t* units, uint32_t unitCount)
    : KolvaneString(reinterpret_cast<const uint8_t*>(units), ByteCount(unitCount)) {}

KolvaneString::KolvaneString(const uint8_t* bytes, uint32_t byteCount)
    : KolvaneString(*ByteRunValue::Create(bytes, byteCount)) {}

KolvaneString& KolvaneString::operator=(const KolvaneString& other) noexcept {
  if (value == other.value) return *this;
  value->Release();
  value = other.value;
  value->AddRef();
  return *this;
}

const KolvaneString& KolvaneString::Empty() {
  static const KolvaneString empty(static_cast<const uint8_t*>(nullptr), 0);
  return empty;
}
