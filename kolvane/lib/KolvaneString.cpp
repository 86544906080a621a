#include "KolvaneString.h"

#include <cstring>
#include <limits>
#include <new>

using tovali_private::ByteRunValue;

namespace tovali_private {

ByteRunValue::ByteRunValue(const uint8_t* bytes, uint32_t byteCount) : length(byteCount) {
  if (byteCount == 0) return;
  data = std::make_unique_for_overwrite<uint8_t[]>(byteCount);
  std::memcpy(data.get(), bytes, byteCount);
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
    : value(new ByteRunValue(bytes, byteCount)) {
  value->AddRef();
}

KolvaneString::KolvaneString(const KolvaneString& other) noexcept : value(other.value) {
  value->AddRef();
}

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
