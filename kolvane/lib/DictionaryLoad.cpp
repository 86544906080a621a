// The road of an image into a dictionary.
#include <algorithm>
#include <array>
#include <cstdio>
#include <istream>
#include <string_view>
#include <utility>
#include <vector>

#include "BinaryLoader.h"
#include "DictionaryReader.h"
#include "DictionaryTable.h"
#include "TextSyntax.h"

using tovali_private::DictionaryReader;

namespace {

using tovali_private::kBinaryMagic;

enum class Recognised { kTooShort, kText, kBinary };

// The test for the binary format, on the 21 bytes where the stream stands. Leaves the stream at its
// start.
Recognised Recognise(std::istream& image) {
  std::array<char, kBinaryMagic.size()> head{};
  if (!image.read(head.data(), head.size())) return Recognised::kTooShort;
  image.seekg(0);
  const bool isBinary = std::string_view(head.data(), head.size()) == kBinaryMagic;
  return isBinary ? Recognised::kBinary : Recognised::kText;
}

}  // namespace

void DictionaryTable::Load(std::istream& image) {
  lastLoad = {};
  lastLoad.damage = LoadDamage::kInterrupted;  // until the load has come to an end
  const auto reader = DictionaryReader::Create(&image);
  switch (Recognise(image)) {
    case Recognised::kTooShort:
      lastLoad.damage = LoadDamage::kTooShort;
      break;
    case Recognised::kText:
      LoadText(image, *reader);
      break;
    case Recognised::kBinary:
      tovali_private::LoadBinary(*this, image, lastLoad);
      break;
  }
}

void DictionaryTable::LoadText(std::istream& image, DictionaryReader& reader) {
  lastLoad.format = ImageFormat::kText;
  lastLoad.encoding = reader.Encoding();
  while (const uint16_t* line = reader.GetNextLine()) {
    if (line[0] == 0) continue;
    switch (StoreLine({line, reader.LineLength()})) {
      case StoredLine::kDropped:
        ++lastLoad.linesDropped;
        break;
      case StoredLine::kReplaced:
        ++lastLoad.entriesReplaced;
        [[fallthrough]];
      case StoredLine::kAdded:
        ++lastLoad.entriesAdded;
        break;
    }
  }
  lastLoad.damage = LoadDamage::kNone;
  if (image.bad()) {
    lastLoad.damage = LoadDamage::kInterrupted;
  } else if (const auto end = image.tellg(); image.good() && image.peek() != EOF) {
    lastLoad.damage = LoadDamage::kZeroCharacter;
    const int zeroBytes = reader.Encoding() == TextEncoding::kCodePage ? 1 : 2;
    lastLoad.damageOffset = static_cast<uint64_t>(end - std::streamoff{zeroBytes});
  }
}

StoredLine DictionaryTable::StoreLine(std::span<const uint16_t> line) {
  const auto split = tovali_private::SplitKolvane(tovali_private::EntryText(line));
  if (!split) return StoredLine::kDropped;
  std::vector<uint8_t> narrowed(split->key.size());
  std::transform(split->key.begin(), split->key.end(), narrowed.begin(),
                 [](uint16_t unit) { return static_cast<uint8_t>(unit); });
  const ByteRunKey key(narrowed.data(), static_cast<uint32_t>(narrowed.size()), false);
  auto entry = std::make_unique<DictionaryEntry>(key, split->value.data(),
                                                 static_cast<uint32_t>(split->value.size()));
  const bool replaces = Detach(key) != nullptr;
  Insert(std::move(entry));
  return replaces ? StoredLine::kReplaced : StoredLine::kAdded;
}
