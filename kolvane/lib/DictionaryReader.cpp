#include "DictionaryReader.h"

#include <algorithm>
#include <istream>

#include "Converters.h"
#include "HeldBytes.h"
#include "LittleEndian.h"
#include "Scan.h"

namespace tovali_private {
namespace {

// What ends a line, and the zero that ends the input too.
using UnicodeEnds = UnitSet<0, 0x000A, 0x000D, 0x2028, 0x2029>;
using MultibyteEnds = UnitSet<0, 0x0A, 0x0D>;

constexpr uint16_t Swapped(uint16_t unit) noexcept {
  return static_cast<uint16_t>(unit << 8 | unit >> 8);
}

}  // namespace

TextEncoding EncodingByMark(std::string_view image) noexcept {
  if (image.starts_with("\xFF\xFE")) return TextEncoding::kUTF16LE;
  if (image.starts_with("\xFE\xFF")) return TextEncoding::kUTF16BE;
  return TextEncoding::kCodePage;
}

std::unique_ptr<DictionaryReader> DictionaryReader::Create(std::istream* stream) {
  const bool isReadable = stream != nullptr && stream->good();
  uint8_t mark[2] = {};
  uint32_t count = sizeof mark;
  ReadStreamBytes(stream, mark, count);
  switch (EncodingByMark({reinterpret_cast<const char*>(mark), count})) {
    case TextEncoding::kUTF16LE:
      return std::make_unique<UnicodeReader>(stream);
    case TextEncoding::kUTF16BE:
      return std::make_unique<ByteSwapUnicodeReader>(stream);
    default:
      break;
  }
  if (isReadable && !stream->bad()) {
    stream->clear();  // of the end that a stream of fewer than two bytes has met
    stream->seekg(0);
  }
  return std::make_unique<MultibyteReader>(stream);
}

std::span<const uint8_t> DictionaryReader::Held() {
  return stream != nullptr ? HeldBytes(*stream) : std::span<const uint8_t>();
}

void DictionaryReader::Skip(size_t count) noexcept {
  if (count != 0) SkipHeld(*stream, count);
}

void DictionaryReader::ReadStreamBytes(std::istream* stream, uint8_t* bytes, uint32_t& count) {
  uint32_t stored = 0;
  while (stream != nullptr && stored < count) {
    const auto held = HeldBytes(*stream);
    const size_t taken = std::min<size_t>(held.size(), count - stored);
    if (taken == 0) {
      char byte = 0;
      if (!stream->get(byte)) break;
      bytes[stored++] = static_cast<uint8_t>(byte);
      continue;
    }
    std::copy_n(held.data(), taken, bytes + stored);
    SkipHeld(*stream, taken);
    stored += static_cast<uint32_t>(taken);
  }
  count = stored;
}

const uint16_t* UnicodeReader::GetNextLine() {
  line.Clear();
  for (uint16_t unit = 0;;) {
    TakeHeldUnits();
    if (ReadChar(unit)) {
      if (line.Length() == 0) return nullptr;
      break;
    }
    if (UnicodeEnds::Has(unit)) break;
    line.Append(unit);
  }
  line.Append(0);
  return line.Data();
}

// Takes the units up to the first that ends the line or the input.
void UnicodeReader::TakeHeldUnits() {
  constexpr size_t kBlock = 64;
  const bool isSwapped = Encoding() == TextEncoding::kUTF16BE;
  for (;;) {
    const auto held = Held();
    const std::span<uint16_t> block = line.Extend(std::min(held.size() / 2, kBlock));
    std::copy_n(held.data(), block.size_bytes(), reinterpret_cast<uint8_t*>(block.data()));
    if (isSwapped) std::transform(block.begin(), block.end(), block.begin(), Swapped);
    const size_t run = UnicodeEnds::RunBefore(std::span<const uint16_t>(block));
    line.SetLength(line.Length() - static_cast<uint32_t>(block.size() - run));
    Skip(2 * run);
    if (run < kBlock) return;
  }
}

bool UnicodeReader::ReadChar(uint16_t& unit) {
  uint8_t bytes[2] = {};
  uint32_t count = sizeof bytes;
  ReadBytes(bytes, count);
  unit = Read16(bytes);
  return count == 0 || unit == 0;
}

bool ByteSwapUnicodeReader::ReadChar(uint16_t& unit) {
  const bool ended = UnicodeReader::ReadChar(unit);
  unit = Swapped(unit);
  return ended;
}

const uint16_t* MultibyteReader::GetNextLine() {
  bytes.Clear();
  for (;;) {
    TakeHeldBytes();
    uint8_t byte = 0;
    uint32_t count = 1;
    ReadBytes(&byte, count);
    if (count == 0 || byte == 0) {
      if (bytes.Length() == 0) return nullptr;
      break;
    }
    if (MultibyteEnds::Has(byte)) break;
    bytes.Append(byte);
  }
  ConvertToUnicode(reinterpret_cast<const char*>(bytes.Data()), bytes.Length(), line);
  line.Append(0);
  return line.Data();
}

// Takes the bytes up to the first that ends the line or the input.
void MultibyteReader::TakeHeldBytes() {
  const auto held = Held();
  const size_t run = MultibyteEnds::RunBefore(held);
  const std::span<uint8_t> block = bytes.Extend(run);
  std::copy_n(held.data(), run, block.data());
  Skip(run);
}

}  // namespace tovali_private
