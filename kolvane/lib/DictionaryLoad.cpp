// The road of an image into a dictionary.
#include <array>
#include <istream>
#include <string_view>
#include <utility>

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

// Leaves the stream at its start.
uint64_t SizeOf(std::istream& image) {
  image.seekg(0, std::ios::end);
  const std::streamoff end = image.tellg();
  image.seekg(0);
  return end > 0 ? static_cast<uint64_t>(end) : 0;
}

// Whether a text image, whose last line has been read, ended there and ended well.
void CheckTextEnd(std::istream& image, TextEncoding encoding, LoadStatus& status) {
  if (image.bad()) return;  // and leaves the load interrupted
  const std::streamoff unitSize = encoding == TextEncoding::kCodePage ? 1 : 2;
  const std::streamoff stop = image.good() ? std::streamoff{image.tellg()} : 0;
  image.clear();
  image.seekg(0, std::ios::end);
  const std::streamoff end = image.tellg();
  status.damage = LoadDamage::kNone;
  if (stop != 0 && stop < end) {
    status.damage = LoadDamage::kZeroCharacter;
    status.damageOffset = static_cast<uint64_t>(stop - unitSize);
  } else if (end % unitSize != 0) {
    status.damage = LoadDamage::kHalfUnit;
    status.damageOffset = static_cast<uint64_t>(end - 1);
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
      lastLoad.damage = LoadDamage::kTooShort;
      break;
    case Recognised::kText: {
      const MoveAtEnd moving(*this);
      LoadText(image, *reader);
      break;
    }
    case Recognised::kBinary:
      tovali_private::LoadBinary(*this, image, lastLoad);
      break;
  }
}

void DictionaryTable::LoadText(std::istream& image, DictionaryReader& reader) {
  lastLoad.format = ImageFormat::kText;
  lastLoad.encoding = reader.Encoding();
  const uint64_t size = SizeOf(image);
  memory.Expect(size);
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
