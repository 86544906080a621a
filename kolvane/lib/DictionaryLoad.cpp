// The road of an image into a dictionary.
#include <array>
#include <istream>
#include <string_view>
#include <utility>

#include "BinaryLoader.h"
#include "DictionaryReader.h"
#include "DictionaryTable.h"
#include "StreamSize.h"
#include "TextSyntax.h"

using tovali_private::DictionaryReader;

namespace {

using tovali_private::kBinaryMagic;
using tovali_private::SkipToEnd;
using tovali_private::StreamSize;

// Whether anything other than its end ended the reading of the stream.
bool HasFailed(const std::istream& image) {
  return image.bad() || (image.fail() && !image.eof());
}

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

// Whether a text image, whose last line has been read, ended there and ended well.
void CheckTextEnd(std::istream& image, TextEncoding encoding, LoadStatus& status) {
  if (HasFailed(image)) return;  // the load stays interrupted
  const uint64_t unitSize = encoding == TextEncoding::kCodePage ? 1 : 2;
  const uint64_t left = image.good() ? SkipToEnd(image) : 0;
  const uint64_t size = StreamSize(image);
  if (image.bad()) return;
  status.damage = LoadDamage::kNone;
  if (left != 0) {
    status.damage = LoadDamage::kZeroCharacter;
    status.damageOffset = size - left - unitSize;
  } else if (size % unitSize != 0) {
    status.damage = LoadDamage::kHalfUnit;
    status.damageOffset = size - 1;
  }
}

}  // namespace

// Also where a load throws.
class DictionaryTable::MoveAtEnd {
 public:
  explicit MoveAtEnd(DictionaryTable& loadedTable) noexcept : table(loadedTable) {}
  MoveAtEnd(const MoveAtEnd&) = delete;
  MoveAtEnd& operator=(const MoveAtEnd&) = delete;
  ~MoveAtEnd() { table.MoveFromMostlyDeadMemory(); }

 private:
  DictionaryTable& table;
};

void DictionaryTable::Load(std::istream& image) {
  lastLoad = {};
  ++loadNumber;
  lastLoad.damage = LoadDamage::kInterrupted;  // until the load has come to an end
  const auto reader = DictionaryReader::Create(&image);
  switch (Recognise(image)) {
    case Recognised::kTooShort:
      if (!HasFailed(image)) lastLoad.damage = LoadDamage::kTooShort;
      break;
    case Recognised::kText: {
      const MoveAtEnd moving(*this);
      LoadText(image, *reader);
      break;
    }
    case Recognised::kBinary:
      tovali_private::LoadBinary(*this, image, lastLoad);
      if (HasFailed(image)) lastLoad.damage = LoadDamage::kInterrupted;
      break;
  }
}

void DictionaryTable::LoadText(std::istream& image, DictionaryReader& reader) {
  lastLoad.format = ImageFormat::kText;
  lastLoad.encoding = reader.Encoding();
  memory.Expect(StreamSize(image));
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
  CheckTextEnd(image, reader.Encoding(), lastLoad);
}

StoredLine DictionaryTable::StoreLine(std::span<const uint16_t> line) {
  const auto split = tovali_private::SplitKolvane(tovali_private::EntryText(line));
  if (!split) return StoredLine::kDropped;
  const auto narrowed = tovali_private::NarrowKey(split->key);
  const ByteRunKey key(narrowed.data(), static_cast<uint32_t>(narrowed.size()), false);
  index.Prepare(key.Bytes());
  auto entry = DictionaryEntry::Create(memory, key, split->value);
  MakeRoom(key.Hash(kBucketCount));
  const bool replaces = Detach(key) != nullptr;
  Insert(std::move(entry));
  return replaces ? StoredLine::kReplaced : StoredLine::kAdded;
}
