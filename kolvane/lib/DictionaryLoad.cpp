// The road of an image into a dictionary.
#include <algorithm>
#include <array>
#include <utility>

#include "kolvane/lib/BinaryLoader.h"
#include "kolvane/lib/ByteStreams.h"
#include "kolvane/lib/DictionaryReader.h"
#include "kolvane/lib/DictionaryTable.h"
#include "kolvane/lib/TextSyntax.h"

using tovali_private::DictionaryReader;
using tovali_private::InputStream;

namespace {

using tovali_private::kBinaryMagic;

enum class Recognised { kTooShort, kText, kBinary };

// Tests for the binary format, with the 21 bytes at the stream's position. Leaves the stream at its
// start.
Recognised Recognise(InputStream& image) {
  std::array<uint8_t, kBinaryMagic.size()> head{};
  if (image.Read(head) < head.size()) return Recognised::kTooShort;
  image.Rewind();
  return std::ranges::equal(head, kBinaryMagic) ? Recognised::kBinary : Recognised::kText;
}

// Whether a text image, whose last line has been read, ended there and ended well.
void CheckTextEnd(InputStream& image, TextEncoding encoding, LoadStatus& status) {
  const uint64_t unitSize = encoding == TextEncoding::kCodePage ? 1 : 2;
  const uint64_t left = image.SkipToEnd();
  if (image.HasFailed()) return;  // the load stays interrupted
  status.damage = LoadDamage::kNone;
  if (left != 0) {
    status.damage = LoadDamage::kZeroCharacter;
    status.damageOffset = image.Size() - left - unitSize;
  } else if (image.Size() % unitSize != 0) {
    status.damage = LoadDamage::kHalfUnit;
    status.damageOffset = image.Size() - 1;
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

void DictionaryTable::Load(InputStream& image) {
  lastLoad = {};
  ++loadNumber;
  lastLoad.damage = LoadDamage::kInterrupted;  // until the load has come to an end
  const auto reader = DictionaryReader::Create(&image);
  switch (Recognise(image)) {
    case Recognised::kTooShort:
      if (!image.HasFailed()) lastLoad.damage = LoadDamage::kTooShort;
      break;
    case Recognised::kText: {
      const MoveAtEnd moving(*this);
      LoadText(image, *reader);
      break;
    }
    case Recognised::kBinary:
      tovali_private::LoadBinary(*this, image, lastLoad);
      if (image.HasFailed()) lastLoad.damage = LoadDamage::kInterrupted;
      break;
  }
}

void DictionaryTable::LoadText(InputStream& image, DictionaryReader& reader) {
  lastLoad.format = ImageFormat::kText;
  lastLoad.encoding = reader.Encoding();
  memory.Expect(image.Size());
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
