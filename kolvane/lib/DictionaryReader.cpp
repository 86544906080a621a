#include "DictionaryReader.h"

#include <istream>

#include "Converters.h"
#include "LittleEndian.h"

namespace tovali_private {
namespace {

constexpr uint16_t kByteOrderMark = 0xFEFF;
constexpr uint16_t kSwappedByteOrderMark = 0xFFFE;

constexpr bool EndsLine(uint16_t unit) noexcept {
  return unit == 0x000A || unit == 0x000D || unit == 0x2028 || unit == 0x2029;
}

constexpr bool EndsLine(uint8_t byte) noexcept {
  return byte == 0x0A || byte == 0x0D;
}

}  // namespace

std::unique_ptr<DictionaryReader> DictionaryReader::Create(std::istream* stream) {
  const bool readable = stream != nullptr && stream->good();
  uint8_t mark[2] = {};
  uint32_t count = sizeof mark;
  ReadStreamBytes(stream, mark, count);
  if (count == sizeof mark) {
    const uint16_t unit = Read16(mark);
    if (unit == kByteOrderMark) return std::make_unique<UnicodeReader>(stream);
    if (unit == kSwappedByteOrderMark) return std::make_unique<ByteSwapUnicodeReader>(stream);
  }
  if (readable) {
    stream->clear();  // of the end that a stream of fewer than two bytes has met
    stream->seekg(0);
  }
  return std::make_unique<MultibyteReader>(stream);
}

void DictionaryReader::ReadStreamBytes(std::istream* stream, uint8_t* bytes, uint32_t& count) {
  uint32_t stored = 0;
  for (char byte = 0; stream != nullptr && stored < count && stream->get(byte);) {
    bytes[stored++] = static_cast<uint8_t>(byte);
  }
  count = stored;
}

const uint16_t* UnicodeReader::GetNextLine() {
  line.Clear();
  for (uint16_t unit = 0;;) {
    if (ReadChar(unit)) {
      if (line.Length() == 0) return nullptr;
      break;
    }
    if (EndsLine(unit)) break;
    line.Append(unit);
  }
  line.Append(0);
  return line.Data();
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
  unit = static_cast<uint16_t>(unit << 8 | unit >> 8);
  return ended;
}

const uint16_t* MultibyteReader::GetNextLine() {
  bytes.Clear();
  for (;;) {
    uint8_t byte = 0;
    uint32_t count = 1;
    ReadBytes(&byte, count);
    if (count == 0 || byte == 0) {
      if (bytes.Length() == 0) return nullptr;
      break;
    }
    if (EndsLine(byte)) break;
    bytes.Append(byte);
  }
  ConvertToUnicode(reinterpret_cast<const char*>(bytes.Data()), bytes.Length(), line);
  line.Append(0);
  return line.Data();
}

}  // namespace tovali_private
