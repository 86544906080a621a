// Kernel tokens, and the identifiers of the kernel's data types.
#pragma once

#include "wrapper-framework/source/Names.h"
#include "wrapper-framework/source/VarnelKernel.h"

namespace Varnel {

// VarnelKernel.h describes their payloads.
inline constexpr char kTypeUTF8[] = kVRKTypeUTF8;
inline constexpr char kTypeUTF16[] = kVRKTypeUTF16;
inline constexpr char kTypeUTF16LE[] = kVRKTypeUTF16LE;
inline constexpr char kTypeUTF16BE[] = kVRKTypeUTF16BE;
inline constexpr char kTypeDouble[] = kVRKTypeDouble;
inline constexpr char kTypeBool[] = kVRKTypeBool;
inline constexpr char kTypeNull[] = kVRKTypeNull;
inline constexpr char kTypeToken[] = kVRKTypeToken;
inline constexpr char kTypeList[] = kVRKTypeList;
inline constexpr char kTypeDictionary[] = kVRKTypeDictionary;

// Returns the token of a text, which is borrowed for the call.
VRKToken MakeToken(const char* text);
VRKToken MakeToken(orvane::name_t name);

// Returns the name of the token's text, which the kernel keeps for the whole process.
orvane::name_t TokenName(VRKToken token);

// A token created on first use. Requires: static storage duration, for the text too.
struct StaticToken {
  // Throws: OutputContractViolation if the kernel stores no token, Exception for its failures.
  VRKToken Get();

  const char* text;
  VRKToken token{};  // set to null to have it created again
};

extern StaticToken gTypeUTF8;
extern StaticToken gTypeUTF16;

}  // namespace Varnel
