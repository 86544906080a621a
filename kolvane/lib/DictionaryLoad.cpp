// Loading images: format detection, text lines, and adoption of parsed binary images.
#include <algorithm>
#include <array>
#include <utility>

#include "kolvane/lib/BinaryParser.h"
#include "kolvane/lib/ByteStreams.h"
#include "kolvane/lib/DictionaryReader.h"
#include "kolvane/lib/DictionaryTable.h"
#include "kolvane/lib/TextSyntax.h"

using tovali_private::ConvertedImage;
using tovali_private::Damage;
using tovali_private::DictionaryReader;
using tovali_private::InputStream;
using tovali_private::ParsedImage;
using tovali_private::StoredImage;

namespace {

using tovali_private::kBinaryMagic;

enum class DetectedFormat { kTooShort, kText, kBinary };

// Tests for the binary format, with the 21 bytes at the stream's position. Leaves the stream at its
// start.
DetectedFormat DetectFormat(InputStream& image) {
  std::array<uint8_t, kBinaryMagic.size()> head{};
  if (image.Read(head) < head.size()) return DetectedFormat::kTooShort;
  image.Rewind();
  return std::ranges::equal(head, kBinaryMagic) ? DetectedFormat::kBinary : DetectedFormat::kText;
}

// Returns the damage at the end of a text image whose last line has been read.
Damage DamageAtTextEnd(InputStream& image, TextEncoding encoding) {
  const uint64_t unitSize = encoding == TextEncoding::kCodePage ? 1 : 2;
  const uint64_t left = image.SkipToEnd();
  if (image.HasFailed()) return {LoadDamage::kInterrupted};
  if (left != 0) return {LoadDamage::kZeroCharacter, image.Size() - left - unitSize};
  if (image.Size() % unitSize != 0) return {LoadDamage::kHalfUnit, image.Size() - 1};
  return {};
}

}  // namespace

// Compacts on scope exit, exceptions included.
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
  lastLoad.Begin();
  const auto reader = DictionaryReader::Create(&image);
  switch (DetectFormat(image)) {
    case DetectedFormat::kTooShort:
      if (!image.HasFailed()) lastLoad.End({LoadDamage::kTooShort});
      break;
    case DetectedFormat::kText: {
      const MoveAtEnd moving(*this);
      LoadText(image, *reader);
      break;
    }
    case DetectedFormat::kBinary:
      LoadBinary(image);
      break;
  }
}

void DictionaryTable::LoadText(InputStream& image, DictionaryReader& reader) {
  lastLoad.SetFormat(ImageFormat::kText, reader.Encoding());
  memory.Expect(image.Size());
  while (const uint16_t* line = reader.GetNextLine()) {
    if (line[0] != 0) lastLoad.Count(StoreLine({line, reader.LineLength()}));
  }
  lastLoad.End(DamageAtTextEnd(image, reader.Encoding()));
}

void DictionaryTable::LoadBinary(InputStream& image) {
  ParsedImage parsed = tovali_private::ParseBinary(image);
  lastLoad.SetFormat(parsed.format, parsed.encoding);
  if (parsed.encoding == TextEncoding::kUTF16LE) {
    Adopt(std::move(parsed.stored));
  } else {
    ConvertedImage converted = tovali_private::ConvertValues(parsed.stored);
    Adopt(std::move(converted.stored));
    if (converted.failure != nullptr) {
      lastLoad.SetInterruption(converted.failureOffset);
      std::rethrow_exception(converted.failure);
    }
    if (parsed.damage.kind == LoadDamage::kNone) parsed.damage = converted.misfiled;
  }
  if (image.HasFailed()) parsed.damage.kind = LoadDamage::kInterrupted;
  lastLoad.End(parsed.damage);
}

// Queues the groups, in their order, in front of their buckets' entries. Groups of buckets that
// the table lacks are dropped; entries in another bucket than their key's are never found.
void DictionaryTable::Adopt(StoredImage&& image) {
  image.load = lastLoad.Number();
  lastLoad.CountAdded(waiting.Add(std::move(image)));
}

StoredLine DictionaryTable::StoreLine(std::span<const uint16_t> line) {
  const auto split = tovali_private::SplitKolvane(tovali_private::QuotedPart(line));
  if (!split) return StoredLine::kDropped;
  const auto bytes = tovali_private::ToKeyBytes(split->key);
  const ByteRunKey probe(bytes.data(), static_cast<uint32_t>(bytes.size()), false);
  const KeyHashes key = HashesOf(probe);
  index.Prepare(key.inIndex);
  auto created = DictionaryEntry::Create(memory, probe, split->value);
  MakeRoom(key.bucket);
  DictionaryEntry& entry = LinkAtHead(key.bucket, std::move(created));
  if (!MakeFindable(entry, key.inIndex)) return StoredLine::kAdded;
  DestroyHidden(entry);
  return StoredLine::kReplaced;
}
