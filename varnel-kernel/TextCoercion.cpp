#include "varnel-kernel/TextCoercion.h"

#include <algorithm>
#include <bit>
#include <cstddef>
#include <limits>
#include <new>
#include <string_view>
#include <vector>

#include "platform/CodePage.h"
#include "platform/Unicode.h"

namespace varnel_kernel {
namespace {

static_assert(std::endian::native == std::endian::little);

using Units = std::vector<uint16_t>;

int CheckedCount(size_t count) {
  if (count > std::numeric_limits<int>::max()) throw std::bad_alloc();
  return static_cast<int>(count);
}

std::string_view TextOf(Data& data) {
  return {reinterpret_cast<const char*>(data.Bytes()), data.byteCount};
}

Units FromUTF8(std::string_view text) {
  if (text.starts_with(platform::kBOMUTF8)) text.remove_prefix(platform::kBOMUTF8.size());
  const int byteCount = CheckedCount(text.size());
  const int unitCount =
      platform::MultiByteToWideChar(platform::kCodePageUTF8, 0, text.data(), byteCount, nullptr, 0);
  Units units(static_cast<size_t>(unitCount));
  platform::MultiByteToWideChar(platform::kCodePageUTF8, 0, text.data(), byteCount, units.data(),
                                unitCount);
  return units;
}

void SwapBytes(Units& units) {
  for (uint16_t& unit : units) unit = platform::SwapBytes(unit);
}

void ReplaceUnpaired(Units& units) {
  for (size_t i = 0; i < units.size(); ++i) {
    if (!platform::IsSurrogate(units[i])) continue;
    const bool isPaired = platform::IsHighSurrogate(units[i]) && i + 1 < units.size() &&
                          platform::IsLowSurrogate(units[i + 1]);
    if (isPaired) {
      ++i;
    } else {
      units[i] = platform::kReplacementCharacter;
    }
  }
}

Units FromUTF16(std::string_view bytes, bool bigEndian, bool marked) {
  Units units(bytes.size() / 2);
  std::copy_n(bytes.data(), units.size() * 2, reinterpret_cast<char*>(units.data()));
  const bool swappedMark =
      marked && !units.empty() && units.front() == platform::SwapBytes(platform::kByteOrderMark);
  if (bigEndian || swappedMark) SwapBytes(units);
  if (marked && !units.empty() && units.front() == platform::kByteOrderMark)
    units.erase(units.begin());
  ReplaceUnpaired(units);
  if (bytes.size() % 2 != 0) units.push_back(platform::kReplacementCharacter);
  return units;
}

std::unique_ptr<Data> MakeUTF8(VRKToken type, const Units& units) {
  const int unitCount = CheckedCount(units.size());
  const int byteCount = platform::WideCharToMultiByte(platform::kCodePageUTF8, 0, units.data(),
                                                      unitCount, nullptr, 0);
  if (byteCount == 0 && unitCount != 0) throw std::bad_alloc();
  auto data = Data::Create(type, static_cast<uint32_t>(byteCount));
  platform::WideCharToMultiByte(platform::kCodePageUTF8, 0, units.data(), unitCount,
                                reinterpret_cast<char*>(data->Bytes()), byteCount);
  return data;
}

std::unique_ptr<Data> MakeUTF16(VRKToken type, const Units& units) {
  CheckedCount(units.size() * 2);
  auto data = Data::Create(type, static_cast<uint32_t>(units.size() * 2));
  std::copy_n(reinterpret_cast<const std::byte*>(units.data()), units.size() * 2, data->Bytes());
  return data;
}

}  // namespace

TextCoercion::TextCoercion(TokenTable& tokens)
    : utf8(tokens.TokenOf(kVRKTypeUTF8)),
      utf16le(tokens.TokenOf(kVRKTypeUTF16LE)),
      utf16be(tokens.TokenOf(kVRKTypeUTF16BE)),
      utf16(tokens.TokenOf(kVRKTypeUTF16)) {}

std::unique_ptr<Data> TextCoercion::Coerce(Data& source, VRKToken toType) const {
  const auto from = EncodingOf(source.type);
  const auto to = EncodingOf(toType);
  if (!from || !to) return nullptr;
  const std::string_view text = TextOf(source);
  Units units = from == Encoding::kUTF8
                    ? FromUTF8(text)
                    : FromUTF16(text, from == Encoding::kUTF16BE, from == Encoding::kUTF16);
  if (to == Encoding::kUTF8) return MakeUTF8(toType, units);
  if (to == Encoding::kUTF16) units.insert(units.begin(), platform::kByteOrderMark);
  if (to == Encoding::kUTF16BE) SwapBytes(units);
  return MakeUTF16(toType, units);
}

std::optional<TextCoercion::Encoding> TextCoercion::EncodingOf(VRKToken type) const noexcept {
  if (type == utf8) return Encoding::kUTF8;
  if (type == utf16le) return Encoding::kUTF16LE;
  if (type == utf16be) return Encoding::kUTF16BE;
  if (type == utf16) return Encoding::kUTF16;
  return std::nullopt;
}

}  // namespace varnel_kernel
