// The built-in coercions, between the four text types.
#pragma once

#include <memory>
#include <optional>

#include "varnel-kernel/TokenTable.h"
#include "varnel-kernel/Values.h"

namespace varnel_kernel {

// Types: "type:orvane.vrk.utf8", "…utf16le", "…utf16be" and "…utf16".
//
// - Malformed UTF-8, an unpaired surrogate and an odd last byte each become U+FFFD.
// - A byte-order mark at the start of utf8 and utf16 text is consumed. For utf16 it selects the
//   byte order, which is little-endian without one. In utf16le and utf16be it is a character.
// - utf16 data is produced in little-endian order with a byte-order mark.
class TextCoercion {
 public:
  explicit TextCoercion(TokenTable& tokens);

  // Returns null if one of the types is not a text type. Throws: std::bad_alloc, also for a text of
  // 2^31 bytes or units or more.
  std::unique_ptr<Data> Coerce(Data& source, VRKToken toType) const;

 private:
  enum class Encoding { kUTF8, kUTF16LE, kUTF16BE, kUTF16 };

  std::optional<Encoding> EncodingOf(VRKToken type) const noexcept;

  const VRKToken utf8;
  const VRKToken utf16le;
  const VRKToken utf16be;
  const VRKToken utf16;
};

}  // namespace varnel_kernel
