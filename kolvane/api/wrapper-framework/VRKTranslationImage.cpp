#include "kolvane/api/wrapper-framework/VRKTranslationImage.h"

#include <cstring>
#include <utility>

namespace Varnel {

TranslationImage PackTranslationImage(const void* bytes, uint32_t byteCount) {
  if (byteCount == 0) return {};
  const uint32_t unitCount = byteCount / 2 + byteCount % 2;
  auto units = std::make_unique_for_overwrite<uint16_t[]>(unitCount);
  units[unitCount - 1] = 0;
  std::memcpy(units.get(), bytes, byteCount);
  return {std::move(units), unitCount};
}

}  // namespace Varnel
