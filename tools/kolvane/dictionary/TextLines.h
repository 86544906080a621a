// The lines of a text dictionary, and where they stand.
#pragma once

#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <string_view>

#include "kolvane/lib/ByteStreams.h"
#include "kolvane/lib/DictionaryReader.h"
#include "tools/kolvane/dictionary/ImageFile.h"

// Numbers the lines of a text image from 1, for offsets in bytes that never fall. CR LF ends one
// line.
class LineCounter {
 public:
  LineCounter(std::string_view textImage, TextEncoding encoding) noexcept;

  // The number of the line that holds the byte at `offset`.
  size_t LineAt(uint64_t offset) noexcept;

  // The characters of that line before the byte; the file's byte-order mark is none.
  size_t CharactersBefore() const noexcept { return characters; }

 private:
  uint32_t UnitAt(size_t at) const noexcept;
  void Pass(uint32_t unit) noexcept;

  std::string_view image;
  size_t unitSize;
  size_t lowByte;
  size_t position = 0;
  size_t line = 1;
  size_t characters = 0;
  uint32_t before = 0;
};

struct TextLine {
  size_t number = 0;               // from 1
  size_t charactersBefore = 0;     // what a zero character has cut off before it, zero included
  std::span<const uint16_t> text;  // without its end
  bool endsAtZero = false;         // a zero character ends it, with more behind
};

// Gives the lines that a translator would, without the empty ones, as they are in the file: in
// UTF-8 without a mark. The first line of UTF-16 begins with its byte-order mark. Borrows the file.
class TextLines {
 public:
  explicit TextLines(const ImageFile& file);

  // Returns false after the last line; a line is valid until the next call.
  bool Next(TextLine& line);

 private:
  bool isUTF8;
  std::string recoded;  // of UTF-8; the image of the file is not the same line by line
  std::string_view image;
  tovali_private::MemoryInput stream;
  std::unique_ptr<tovali_private::DictionaryReader> reader;
  LineCounter counter;
};
