// The coercions that the kernel has built in: between its four types of text.
#pragma once

#include <memory>
#include <optional>

#include "TokenTable.h"
#include "Values.h"

namespace varnel_kernel {

// "type:orvane.vrk.utf8", "…utf16le", "…utf16be" and "…utf16". Malformed and unpaired input becomes
// U+FFFD, as does half a unit at the end. A byte-order mark at the head of utf8 or utf16 text is
// consumed, and tells the byte order of the latter, which is little-endian without one; data
// produced as utf16 is little-endian and begins with the mark. In the other two types a mark is a
// character.
class TextCoercion {
 public:
  explicit TextCoercion(TokenTable& tokens);

  // Null when one of the types is no text. Throws std::bad_alloc, also for a text that is too long
  // to be converted (2^31 bytes or units).
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
