// Kernel tokens, and the identifiers of the kernel's data types.
#pragma once

#include "wrapper-framework/source/Names.h"
#include "wrapper-framework/source/VarnelKernel.h"

namespace Varnel {

// Payloads: text as bytes or 16-bit units, without terminator; a double, 8 bytes; a bool, 1 byte
// that is not 0 for true; a token or handle, 4 bytes.
inline constexpr char kTypeUTF8[] = "type:orvane.vrk.utf8";
inline constexpr char kTypeUTF16[] = "type:orvane.vrk.utf16";  // units in memory's byte order
inline constexpr char kTypeUTF16LE[] = "type:orvane.vrk.utf16le";
inline constexpr char kTypeUTF16BE[] = "type:orvane.vrk.utf16be";
inline constexpr char kTypeDouble[] = "type:orvane.vrk.double";
inline constexpr char kTypeBool[] = "type:orvane.vrk.bool";
inline constexpr char kTypeNull[] = "type:orvane.vrk.null";
inline constexpr char kTypeToken[] = "type:orvane.vrk.token";
inline constexpr char kTypeList[] = "type:orvane.vrk.list";
inline constexpr char kTypeDictionary[] = "type:orvane.vrk.dictionary";

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
