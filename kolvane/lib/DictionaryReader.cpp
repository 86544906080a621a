#include "kolvane/lib/DictionaryReader.h"

#include <algorithm>

#include "kolvane/lib/Converters.h"
#include "kolvane/lib/LittleEndian.h"
#include "kolvane/lib/Scan.h"
#include "kolvane/lib/TextSyntax.h"
#include "platform/Unicode.h"

namespace tovali_private {
namespace {

// A zero ends a line like a line end; if the line is empty, it ends the input.
using UnicodeEnds = DelimiterSet<0, '\n', '\r', kLineSeparatorUnit, kParagraphSeparatorUnit>;
using MultibyteEnds = DelimiterSet<0, '\n', '\r'>;

}  // namespace

TextEncoding EncodingFromBOM(std::string_view image) noexcept {
  if (image.starts_with(platform::kBOMUTF16LE)) return TextEncoding::kUTF16LE;
  if (image.starts_with(platform::kBOMUTF16BE)) return TextEncoding::kUTF16BE;
  return TextEncoding::kCodePage;
}

std::unique_ptr<DictionaryReader> DictionaryReader::Create(InputStream* stream) {
  uint8_t mark[platform::kBOMUTF16LE.size()] = {};
  uint32_t count = sizeof mark;
  ReadStreamBytes(stream, mark, count);
  switch (EncodingFromBOM({reinterpret_cast<const char*>(mark), count})) {
    case TextEncoding::kUTF16LE:
      return std::make_unique<UnicodeReader>(stream);
    case TextEncoding::kUTF16BE:
      return std::make_unique<ByteSwapUnicodeReader>(stream);
    default:
      break;
  }
  if (stream != nullptr) stream->Rewind();
  return std::make_unique<MultibyteReader>(stream);
}

std::span<const uint8_t> DictionaryReader::Buffered() {
  return stream != nullptr ? stream->Buffered() : std::span<const uint8_t>();
}

void DictionaryReader::Consume(size_t count) noexcept {
  if (count != 0) stream->Consume(count);
}

void DictionaryReader::ReadStreamBytes(InputStream* stream, uint8_t* bytes, uint32_t& count) {
  count = stream != nullptr ? static_cast<uint32_t>(stream->Read({bytes, count})) : 0;
}

const uint16_t* UnicodeReader::GetNextLine() {
  line.Clear();
  for (uint16_t unit = 0;;) {
    TakeBufferedUnits();
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

// Appends buffered units up to the first that ends the line or the input.
void UnicodeReader::TakeBufferedUnits() {
  constexpr size_t kBlock = 64;
  const bool isSwapped = Encoding() == TextEncoding::kUTF16BE;
  for (;;) {
    const auto buffered = Buffered();
    const std::span<uint16_t> block = line.Extend(std::min(buffered.size() / 2, kBlock));
    std::copy_n(buffered.data(), block.size_bytes(), reinterpret_cast<uint8_t*>(block.data()));
    if (isSwapped) std::transform(block.begin(), block.end(), block.begin(), platform::SwapBytes);
    const size_t run = UnicodeEnds::FindFirst(std::span<const uint16_t>(block));
    line.SetLength(line.Length() - static_cast<uint32_t>(block.size() - run));
    Consume(2 * run);
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
  unit = platform::SwapBytes(unit);
  return ended;
}

const uint16_t* MultibyteReader::GetNextLine() {
  bytes.Clear();
  for (;;) {
    TakeBufferedBytes();
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

// Appends buffered bytes up to the first that ends the line or the input.
void MultibyteReader::TakeBufferedBytes() {
  const auto buffered = Buffered();
  const size_t run = MultibyteEnds::FindFirst(buffered);
  const std::span<uint8_t> block = bytes.Extend(run);
  std::copy_n(buffered.data(), run, block.data());
  Consume(run);
}

}  // namespace tovali_private
