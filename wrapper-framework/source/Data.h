// Creation of typed kernel data from C++ types, and the typed readers.
#pragma once

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string>
#include <type_traits>
#include <vector>

#include "wrapper-framework/source/KernelRefs.h"
#include "wrapper-framework/source/ReportedCheck.h"

namespace Varnel {

// All copy their input. Pointers may be null if the count is 0. Units are in memory's byte order.
// Throws: Exception for the kernel's failures, std::length_error for more than 2^31 - 1 units.
DataRef MakeData(const char* typeText, const void* bytes, uint32_t byteCount);
DataRef MakeUTF8Data(const void* bytes, uint32_t byteCount);
DataRef MakeUTF16LEData(const uint16_t* units, uint32_t unitCount);
DataRef MakeUTF16Data(const uint16_t* units, uint32_t unitCount);

// Each reader coerces the data to the type in its name and copies the payload.
// Throws: Exception with kResultInputContractViolation if the coercion is impossible,
// InputContractViolation if the payload does not fit its type, Exception for the kernel's failures.
double GetDouble(const DataRef& source);
bool GetBool(const DataRef& source);
VRKToken GetToken(const DataRef& source);
ListRef GetList(const DataRef& source);
DictionaryRef GetDictionary(const DataRef& source);
std::string GetUTF8(const DataRef& source);

// Replace the contents of `units`, which are unchanged if they throw. An odd last byte is ignored.
void GetUTF16LE(const DataRef& source, std::vector<uint16_t>& units);
void GetUTF16(const DataRef& source, std::vector<uint16_t>& units);

// Borrowed bytes, readable while the data is held.
struct RawPayload {
  const void* bytes = nullptr;
  uint32_t byteCount = 0;
};

RawPayload GetRawPayload(const DataRef& source);

VRKToken GetType(const DataRef& source);

// Returns the first bytes of the data, of any type, as a T. A size other than T's is reported;
// missing bytes are 0.
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
