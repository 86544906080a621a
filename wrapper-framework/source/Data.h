// Typed data: made from C++ types and read back into them.
#pragma once

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string>
#include <type_traits>
#include <vector>

#include "Holders.h"
#include "ReportedCheck.h"

namespace Varnel {

// All copy what they are given; pointers may be null where the count is 0. Units are in memory's
// order. More than 2^31 - 1 units are a std::length_error.
DataRef MakeData(const char* typeText, const void* bytes, uint32_t byteCount);
DataRef MakeUTF8Data(const void* bytes, uint32_t byteCount);
DataRef MakeUTF16LEData(const uint16_t* units, uint32_t unitCount);
DataRef MakeUTF16Data(const uint16_t* units, uint32_t unitCount);

// The readers coerce the data to the type that they are named after, and copy out what they read.
// They throw the Exception of kResultInputContractViolation where that is impossible,
// InputContractViolation where the coerced data is not what its type promises, and the kernel's
// failures.
double GetDouble(const DataRef& source);
bool GetBool(const DataRef& source);
VRKToken GetToken(const DataRef& source);
ListRef GetList(const DataRef& source);
DictionaryRef GetDictionary(const DataRef& source);
std::string GetUTF8(const DataRef& source);

// Replace the contents of `units`, unless they throw. An odd last byte belongs to no unit.
void GetUTF16LE(const DataRef& source, std::vector<uint16_t>& units);
void GetUTF16(const DataRef& source, std::vector<uint16_t>& units);

// Bytes that are readable as long as the data is held.
struct RawPayload {
  const void* bytes = nullptr;
  uint32_t byteCount = 0;
};

RawPayload GetRawPayload(const DataRef& source);

VRKToken GetType(const DataRef& source);

// The first bytes of the data, whatever its type, as a T. Another number of bytes than T has is
// reported, and what is missing is 0.
template <class T>
T ExtractData(const DataRef& source) {
  static_assert(std::is_trivially_copyable_v<T>);
  static CheckSite site{.domain = "varnel.wrapper-framework",
                        .condition = "sizeof(T) == dataSize",
                        .sourceFile = "wrapper-framework/source/Data.h",
                        .line = 51,
                        .function = "`anonymous-namespace'::ExtractData"};
  const RawPayload payload = GetRawPayload(source);
  ReportedCheck(site, [&payload] { return sizeof(T) == payload.byteCount; });
  T value{};
  if (payload.bytes != nullptr) {
    std::memcpy(&value, payload.bytes, std::min<size_t>(sizeof value, payload.byteCount));
  }
  return value;
}

}  // namespace Varnel
