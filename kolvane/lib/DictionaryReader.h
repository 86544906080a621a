// Reads the lines of text images as UTF-16, in each of their encodings.
#pragma once

#include <cstdint>
#include <memory>
#include <span>
#include <string_view>

#include "kolvane/lib/ByteStreams.h"
#include "kolvane/lib/GrowableBuffer.h"
#include "kolvane/lib/LoadStatus.h"

namespace tovali_private {

// Returns the encoding of a text image: UTF-16 if it begins with a byte-order mark, else the
// system's code page.
TextEncoding EncodingFromBOM(std::string_view image) noexcept;

// Borrows the stream and reads from its position; the owner may seek between calls. Lines up to
// 2^31 - 1 units. Buffers are reused from line to line.
class DictionaryReader {
 public:
  virtual ~DictionaryReader() = default;

  // Returns the next line, its terminator replaced by a zero unit, valid until the next call; or
  // null at the end of the input. A zero character ends a line; if the line is empty, it ends the
  // input. The next call continues after it. Throws: OVErrException if a line cannot be converted,
  // std::bad_alloc.
  virtual const uint16_t* GetNextLine() = 0;

  // The length in units of the latest line, without its zero unit.
  uint32_t LineLength() const noexcept { return line.Length() - 1; }

  TextEncoding Encoding() const noexcept { return encoding; }

  // Creates the reader for the stream's encoding. Consumes a byte-order mark; without one, seeks
  // back to offset 0.
  static std::unique_ptr<DictionaryReader> Create(InputStream* stream);

 protected:
  DictionaryReader(InputStream* input, TextEncoding inputEncoding)
      : stream(input), encoding(inputEncoding) {}

  // Reads up to `count` bytes and sets `count` to the number read; fewer only at the end.
  void ReadBytes(uint8_t* bytes, uint32_t& count) { ReadStreamBytes(stream, bytes, count); }
  static void ReadStreamBytes(InputStream* stream, uint8_t* bytes, uint32_t& count);

  // See InputStream.
  std::span<const uint8_t> Buffered();
  void Consume(size_t count) noexcept;

  UnicodeBuffer line;

 private:
  InputStream* stream;
  TextEncoding encoding;
};

// UTF-16 in little-endian order. Line feed, carriage return, U+2028 and U+2029 end lines.
class UnicodeReader : public DictionaryReader {
 public:
  explicit UnicodeReader(InputStream* input) : UnicodeReader(input, TextEncoding::kUTF16LE) {}

  const uint16_t* GetNextLine() override;

  // Reads one unit and returns whether the input ends with it: at the end of the stream and at a
  // zero unit. An odd last byte is read as if a zero byte followed.
  virtual bool ReadChar(uint16_t& unit);

 protected:
  using DictionaryReader::DictionaryReader;

 private:
  void TakeBufferedUnits();
};

// UTF-16 in big-endian order.
class ByteSwapUnicodeReader final : public UnicodeReader {
 public:
  explicit ByteSwapUnicodeReader(InputStream* input)
      : UnicodeReader(input, TextEncoding::kUTF16BE) {}

  bool ReadChar(uint16_t& unit) override;
};

// Text of the system's code page. Line feed and carriage return end lines.
class MultibyteReader final : public DictionaryReader {
 public:
  explicit MultibyteReader(InputStream* input) : DictionaryReader(input, TextEncoding::kCodePage) {}

  const uint16_t* GetNextLine() override;

 private:
  void TakeBufferedBytes();

  ByteBuffer bytes;
};

}  // namespace tovali_private
