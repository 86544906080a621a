// The result codes that this code knows. Any other code of the kernel is passed on unchanged.
#pragma once

#include <cstdint>

namespace Varnel {

inline constexpr uint32_t kResultNoError = 0;
inline constexpr uint32_t kResultInputContractViolation = 13;  // also: data cannot be coerced to
                                                               // the type of a reader
inline constexpr uint32_t kResultOutputContractViolation = 14;
inline constexpr uint32_t kResultInvariantViolation = 15;
inline constexpr uint32_t kResultHandlerNotInstalled = 16;
inline constexpr uint32_t kResultOutOfRange = 17;   // std::out_of_range
inline constexpr uint32_t kResultOutOfMemory = 18;  // std::bad_alloc
inline constexpr uint32_t kResultOtherException = 20;
inline constexpr uint32_t kResultBadCast = 21;       // std::bad_cast
inline constexpr uint32_t kResultNotHandled = 256;   // no handler took the message
inline constexpr uint32_t kResultCustomError = 257;  // CustomErrorException
inline constexpr uint32_t kResultCannotCoerce = 512;

}  // namespace Varnel
