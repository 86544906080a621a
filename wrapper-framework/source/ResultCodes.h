// The result codes that this code knows. Any other code of the kernel is passed on unchanged.
#pragma once

#include <cstdint>

#include "wrapper-framework/source/VarnelKernel.h"

namespace Varnel {

inline constexpr uint32_t kResultNoError = kVRKNoError;
inline constexpr uint32_t kResultInputContractViolation = 13;  // also: data cannot be coerced to
                                                               // the type of a reader
inline constexpr uint32_t kResultOutputContractViolation = kVRKNoResult;
inline constexpr uint32_t kResultInvariantViolation = 15;
inline constexpr uint32_t kResultHandlerNotInstalled = 16;
inline constexpr uint32_t kResultOutOfRange = 17;                // std::out_of_range
inline constexpr uint32_t kResultOutOfMemory = kVRKOutOfMemory;  // std::bad_alloc
inline constexpr uint32_t kResultOtherException = kVRKCallbackThrew;
inline constexpr uint32_t kResultBadCast = 21;                 // std::bad_cast
inline constexpr uint32_t kResultNotHandled = kVRKNotHandled;  // no handler took the message
inline constexpr uint32_t kResultCustomError = 257;            // CustomErrorException
inline constexpr uint32_t kResultCannotCoerce = kVRKCannotCoerce;

}  // namespace Varnel
