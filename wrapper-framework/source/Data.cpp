#include "wrapper-framework/source/Data.h"

#include <bit>
#include <limits>
#include <stdexcept>

#include "wrapper-framework/source/Exceptions.h"
#include "wrapper-framework/source/ResultCodes.h"
#include "wrapper-framework/source/Tokens.h"

namespace Varnel {
namespace {

static_assert(std::endian::native == std::endian::little, "utf16le data is copied from memory");

DataRef MakeUnits(const char* typeText, const uint16_t* units, uint32_t unitCount) {
  constexpr uint32_t kMaxUnits = std::numeric_limits<uint32_t>::max() / 2;
  if (unitCount > kMaxUnits) throw std::length_error("Text too long for kernel data");
  return MakeData(typeText, units, unitCount * 2);
}

DataRef CoerceOrThrow(const DataRef& source, VRKToken type) {
  DataRef coerced;
  if (!source.Coerce(type, coerced)) ThrowResultCode(kResultInputContractViolation);
  return coerced;
}

RawPayload ReadPayload(const DataRef& data, VRKToken* outType) {
  RawPayload payload;
  ThrowIfFailed(VRKDataGetData(data.Get(), &payload.bytes, &payload.byteCount, outType));
  return payload;
}

template <class T>
T CopyOne(const RawPayload& payload) {
  if (payload.bytes == nullptr || payload.byteCount != sizeof(T)) throw InputContractViolation();
  T value;
  std::memcpy(&value, payload.bytes, sizeof value);
  return value;
}

template <class T>
T ReadOne(const DataRef& coerced, VRKToken type) {
  VRKToken actualType{};
  const RawPayload payload = ReadPayload(coerced, &actualType);
  if (actualType != type) throw InputContractViolation();
  return CopyOne<T>(payload);
}

void ReadUnits(const DataRef& source, const char* typeText, std::vector<uint16_t>& units) {
  const DataRef coerced = CoerceOrThrow(source, MakeToken(typeText));
  const RawPayload payload = ReadPayload(coerced, nullptr);
  units.resize(payload.byteCount / 2);
  if (!units.empty()) std::memcpy(units.data(), payload.bytes, units.size() * 2);
}

}  // namespace

DataRef MakeData(const char* typeText, const void* bytes, uint32_t byteCount) {
  const VRKToken type = MakeToken(typeText);
  DataRef data;
  data.Create(type, bytes, byteCount);
  return data;
}

DataRef MakeUTF8Data(const void* bytes, uint32_t byteCount) {
  return MakeData(kTypeUTF8, bytes, byteCount);
}

DataRef MakeUTF16LEData(const uint16_t* units, uint32_t unitCount) {
  return MakeUnits(kTypeUTF16LE, units, unitCount);
}

DataRef MakeUTF16Data(const uint16_t* units, uint32_t unitCount) {
  return MakeUnits(kTypeUTF16, units, unitCount);
}

double GetDouble(const DataRef& source) {
  const VRKToken type = MakeToken(kTypeDouble);
  return ReadOne<double>(CoerceOrThrow(source, type), type);
}

bool GetBool(const DataRef& source) {
  const DataRef coerced = CoerceOrThrow(source, MakeToken(kTypeBool));
  return CopyOne<uint8_t>(ReadPayload(coerced, nullptr)) != 0;
}

VRKToken GetToken(const DataRef& source) {
  const VRKToken type = MakeToken(kTypeToken);
  return ReadOne<VRKToken>(CoerceOrThrow(source, type), type);
}

// The handle is retained before `coerced`, whose data owns it, is released.

ListRef GetList(const DataRef& source) {
  const VRKToken type = MakeToken(kTypeList);
  const DataRef coerced = CoerceOrThrow(source, type);
  return ListRef(ReadOne<VRKList>(coerced, type));
}

DictionaryRef GetDictionary(const DataRef& source) {
  const VRKToken type = MakeToken(kTypeDictionary);
  const DataRef coerced = CoerceOrThrow(source, type);
  return DictionaryRef(ReadOne<VRKDictionary>(coerced, type));
}

std::string GetUTF8(const DataRef& source) {
  const DataRef coerced = CoerceOrThrow(source, MakeToken(kTypeUTF8));
  const RawPayload payload = ReadPayload(coerced, nullptr);
  return std::string(static_cast<const char*>(payload.bytes), payload.byteCount);
}

void GetUTF16LE(const DataRef& source, std::vector<uint16_t>& units) {
  ReadUnits(source, kTypeUTF16LE, units);
}

void GetUTF16(const DataRef& source, std::vector<uint16_t>& units) {
  ReadUnits(source, kTypeUTF16, units);
}

RawPayload GetRawPayload(const DataRef& source) {
  const DataRef held(source.Get());
  return ReadPayload(held, nullptr);
}

VRKToken GetType(const DataRef& source) {
  VRKToken type{};
  ThrowIfFailed(VRKDataGetData(source.Get(), nullptr, nullptr, &type));
  return type;
}

}  // namespace Varnel
