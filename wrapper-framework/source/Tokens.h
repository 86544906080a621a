// Kernel tokens, and the texts of those that name the kernel's data types.
#pragma once

#include "Names.h"
#include "VarnelKernel.h"

namespace Varnel {

// Payloads: texts as bytes, or as 16-bit units with two bytes each, without a terminator of their
// own; a double of 8 bytes; a byte that is not 0 for true; tokens and handles of 4 bytes.
inline constexpr char kTypeUTF8[] = "type:orvane.vrk.utf8";
inline constexpr char kTypeUTF16[] = "type:orvane.vrk.utf16";  // units in memory's order
inline constexpr char kTypeUTF16LE[] = "type:orvane.vrk.utf16le";
inline constexpr char kTypeUTF16BE[] = "type:orvane.vrk.utf16be";
inline constexpr char kTypeDouble[] = "type:orvane.vrk.double";
inline constexpr char kTypeBool[] = "type:orvane.vrk.bool";
inline constexpr char kTypeNull[] = "type:orvane.vrk.null";
inline constexpr char kTypeToken[] = "type:orvane.vrk.token";
inline constexpr char kTypeList[] = "type:orvane.vrk.list";
inline constexpr char kTypeDictionary[] = "type:orvane.vrk.dictionary";

// The token of a text that may go away after the call.
VRKToken MakeToken(const char* text);
VRKToken MakeToken(orvane::name_t name);

// The name whose text is the token's. Tokens' texts last, as names need it.
orvane::name_t TokenName(VRKToken token);

// A token that is made when it is first asked for. A static object, of a text that is one, too.
struct StaticToken {
  // Throws OutputContractViolation when the kernel made none.
  VRKToken Get();

  const char* text;
  VRKToken token{};  // may be set back to null, and is then made again
};

extern StaticToken gTypeUTF8;
extern StaticToken gTypeUTF16;

}  // namespace Varnel
