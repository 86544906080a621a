#include "tools/kolvane/dictionary/TextLines.h"

#include "tools/kolvane/dictionary/UTF8Image.h"
#include "tools/kolvane/text/Unicode.h"

LineCounter::LineCounter(std::string_view textImage, TextEncoding encoding) noexcept
    : image(textImage),
      unitSize(encoding == TextEncoding::kCodePage ? 1 : 2),
      lowByte(encoding == TextEncoding::kUTF16BE ? 1 : 0) {}

uint32_t LineCounter::UnitAt(size_t at) const noexcept {
  const uint32_t unit = static_cast<uint8_t>(image[at + lowByte]);
  if (unitSize == 1) return unit;
  return unit | uint32_t{static_cast<uint8_t>(image[at + 1 - lowByte])} << 8;
}

void LineCounter::Pass(uint32_t unit) noexcept {
  const bool afterReturn = unit == '\n' && before == '\r';
  const bool endsLine = IsLineEnd(unit);
  const bool isMark = unitSize == 2 && position == 0;
  const bool isSecondHalf = unitSize == 2 && unit >= 0xDC00 && unit < 0xE000;
  if (endsLine && !afterReturn) ++line;
  characters = endsLine ? 0 : characters + (isMark || isSecondHalf ? 0 : 1);
  before = unit;
}

size_t LineCounter::LineAt(uint64_t offset) noexcept {
  for (; position + unitSize <= offset && position + unitSize <= image.size();
       position += unitSize) {
    Pass(UnitAt(position));
  }
  return line;
}

TextLines::TextLines(const ImageFile& file)
    : isUTF8(!file.utf8.empty()),
      recoded(isUTF8 ? MarkedUTF16(file.utf8) : std::string()),
      image(isUTF8 ? recoded : file.bytes),
      stream(image),
      reader(tovali_private::DictionaryReader::Create(&stream)),
      counter(image, reader->Encoding()) {
  stream.Rewind();
}

bool TextLines::Next(TextLine& line) {
  for (;;) {
    const size_t start = static_cast<size_t>(stream.Position());
    const uint16_t* const text = reader->GetNextLine();
    if (text == nullptr) return false;
    if (reader->LineLength() == 0) continue;
    const size_t end = static_cast<size_t>(stream.Position());
    const bool isWide = reader->Encoding() != TextEncoding::kCodePage;
    const bool endsInText = end < image.size();
    const bool lastIsZero = image[end - 1] == 0 && (!isWide || image[end - 2] == 0);
    const size_t number = counter.LineAt(start);
    line = {
        number, counter.CharactersBefore(), {text, reader->LineLength()}, endsInText && lastIsZero};
    if (start != 0 || !isUTF8) return true;
    line.text = line.text.subspan(1);  // the mark
    if (!line.text.empty()) return true;
    if (lastIsZero) return false;
  }
}
