// Text images as lines of UTF-16, whatever they are encoded in.
#pragma once

#include <cstdint>
#include <memory>
#include <span>
#include <string_view>

#include "kolvane/lib/ByteStreams.h"
#include "kolvane/lib/GrowableBuffer.h"
#include "kolvane/lib/LoadStatus.h"

namespace tovali_private {

// The encoding of a text image, told from its first two bytes: a byte-order mark of UTF-16, or else
// the system's code page.
TextEncoding EncodingByMark(std::string_view image) noexcept;

// Reads one stream, which it borrows, from where it stands; whoever owns the stream may move it
// between two lines. Buffers are kept from line to line, and lines have no length limit but theirs.
class DictionaryReader {
 public:
  virtual ~DictionaryReader() = default;

  // The next line without its terminator but with a zero unit behind it, valid until the next call;
  // null when the input ends and no line is pending. A zero character ends a line, and the input
  // where no line is pending; the next call reads on behind it. Throws OVErrException for a line
  // that cannot be converted and std::bad_alloc for one that cannot be held.
  virtual const uint16_t* GetNextLine() = 0;

  // The length in units of the line that GetNextLine returned last, its zero unit not counted.
  uint32_t LineLength() const noexcept { return line.Length() - 1; }

  TextEncoding Encoding() const noexcept { return encoding; }

  // For the encoding that the mark tells. A mark is left behind the stream's position; without one
  // the stream is moved back to position 0.
  static std::unique_ptr<DictionaryReader> Create(InputStream* stream);

 protected:
  DictionaryReader(InputStream* input, TextEncoding inputEncoding)
      : stream(input), encoding(inputEncoding) {}

  // Reads up to `count` bytes and sets `count` to the number read, which is less only at the end.
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

  // Reads one unit and returns whether the input ends with it, which it does where no byte is left
  // and at a zero unit. A single last byte counts as followed by a zero byte.
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
