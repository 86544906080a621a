#include "kolvane/lib/DictionaryWriter.h"

#include <algorithm>
#include <ostream>
#include <span>
#include <stdexcept>
#include <string_view>

#include "kolvane/lib/BinaryParser.h"
#include "kolvane/lib/ByteStreams.h"
#include "kolvane/lib/Converters.h"
#include "kolvane/lib/DictionaryTable.h"
#include "kolvane/lib/LittleEndian.h"
#include "kolvane/lib/StoredGroups.h"

namespace tovali_private {
namespace {

using Entries = std::vector<const DictionaryEntry*>;
using Bytes = std::span<const uint8_t>;
using Units = std::span<const uint16_t>;

constexpr size_t kHeaderSize = kBinaryMagic.size() + 3;

// The header's byte for the encoding of values.
uint8_t EncodingByte(TextEncoding values) noexcept {
  switch (values) {
    case TextEncoding::kUTF8:
      return kUTF8Selector;
    case TextEncoding::kCodePage:
      return 2;
    default:
      return 0;
  }
}

// Returns the number of leading units that survive a round trip through the encoding.
size_t CarriedUnits(TextEncoding encoding, Bytes stored, Units value) {
  if (encoding == TextEncoding::kUTF16LE) return value.size();
  UnicodeBuffer buffer;
  ConvertToUnicode(reinterpret_cast<const char*>(stored.data()), stored.size(), buffer,
                   SelectorFor(encoding));
  const Units back(buffer.Data(), buffer.Length());
  return static_cast<size_t>(std::ranges::mismatch(value, back).in1 - value.begin());
}

// Collects the parts of an image, group by group.
class ImageComposer {
 public:
  explicit ImageComposer(TextEncoding valueEncoding)
      : encoding(valueEncoding), encodingByte(EncodingByte(valueEncoding)) {}

  void Append(const DictionaryEntry& entry) {
    const uint32_t bucket = entry.Hash(DictionaryTable::kBucketCount);
    if (image.groups.empty() || image.groups.back().bucket != bucket) image.BeginGroup(bucket);
    const int selector = encodingByte;
    written.Clear();
    const size_t keySize = entry.WriteKey(written, true, nullptr);
    size_t valueSize = entry.WriteValue(written, true, selector == 0 ? nullptr : &selector);
    const Units value = entry.Value().Units();
    if (selector == 0) valueSize = value.size_bytes();  // an odd last byte answers nothing
    const Bytes bytes = written.Bytes().first(keySize + valueSize);
    image.Append(bytes.first(keySize), bytes.subspan(keySize));
    const size_t carried = CarriedUnits(encoding, bytes.subspan(keySize), value);
    if (carried < value.size()) lost.push_back({&entry, carried});
  }

  const std::vector<LostValue>& Lost() const noexcept { return lost; }

  // The format requires at least one group.
  const StoredImage& Finish() {
    if (image.groups.empty()) image.BeginGroup(0);
    return image;
  }

 private:
  TextEncoding encoding;
  uint8_t encodingByte;
  MemoryOutput written;
  StoredImage image;
  std::vector<LostValue> lost;
};

void Put(std::ostream& out, Bytes bytes) {
  out.write(reinterpret_cast<const char*>(bytes.data()),
            static_cast<std::streamsize>(bytes.size()));
}

void Put16(std::ostream& out, size_t value) {
  uint8_t bytes[2];
  Write16(bytes, static_cast<uint16_t>(value));
  Put(out, bytes);
}

void Put32(std::ostream& out, size_t value) {
  uint8_t bytes[4];
  Write32(bytes, static_cast<uint32_t>(value));
  Put(out, bytes);
}

void PutHeader(std::ostream& out, BinaryVersion version, TextEncoding values) {
  const uint8_t fields[] = {1, uint8_t{version == BinaryVersion::k1_5 ? uint8_t{5} : uint8_t{0}},
                            EncodingByte(values)};
  out.write(kBinaryMagic.data(), kBinaryMagic.size());
  Put(out, fields);
}

void PutBody1_5(std::ostream& out, const StoredImage& image) {
  Put32(out, image.groups.size());
  for (const StoredGroup& group : image.groups) Put32(out, group.lengthsEnd / 4);
  Put(out, image.lengths);
  for (const StoredGroup& group : image.groups) Put16(out, group.bucket);
  Put(out, image.data);
}

uint64_t Size1_5(const StoredImage& image) noexcept {
  return kHeaderSize + 4 + 6 * uint64_t{image.groups.size()} + image.lengths.size() +
         image.data.size();
}

// Each offset is the end of the previous group in the file.
void PutBody1_0(std::ostream& out, const StoredImage& image) {
  const size_t recordCount = image.groups.size() + 1;
  const size_t dataAt = kHeaderSize + 2 + 6 * recordCount;
  size_t offset = dataAt;
  Put16(out, recordCount);
  for (const StoredGroup& group : image.groups) {
    Put16(out, group.bucket);
    Put32(out, offset);
    offset = dataAt + group.lengthsEnd + group.dataEnd;
  }
  Put16(out, 0);
  Put32(out, offset);
  image.ForEachEntry([&](const StoredGroup&, const StoredEntry& entry) {
    Put32(out, entry.key.size());
    Put(out, entry.key);
    Put32(out, entry.value.size());
    Put(out, entry.value);
  });
}

uint64_t Size1_0(const StoredImage& image) noexcept {
  return kHeaderSize + 2 + 6 * (uint64_t{image.groups.size()} + 1) + image.lengths.size() +
         image.data.size();
}

}  // namespace

bool KeyComesBefore(const DictionaryEntry* one, const DictionaryEntry* other) noexcept {
  return std::ranges::lexicographical_compare(one->Bytes(), other->Bytes());
}

Entries FoundEntries(DictionaryTable& table) {
  Entries entries;
  for (uint32_t bucket = 0; bucket < DictionaryTable::kBucketCount; ++bucket) {
    const auto begin = static_cast<std::ptrdiff_t>(entries.size());
    for (const HashItem* item = table.Bucket(bucket); item != nullptr; item = item->next) {
      const auto* const entry = static_cast<const DictionaryEntry*>(item);
      if (table.Find(*entry) == entry) entries.push_back(entry);
    }
    std::sort(entries.begin() + begin, entries.end(), KeyComesBefore);
  }
  return entries;
}

std::vector<LostValue> WriteBinary(DictionaryTable& table, BinaryVersion version,
                                   TextEncoding values, std::ostream& out) {
  ImageComposer composer(values);
  for (const DictionaryEntry* entry : FoundEntries(table)) composer.Append(*entry);
  if (!composer.Lost().empty()) return composer.Lost();
  const StoredImage& image = composer.Finish();
  const bool is1_5 = version == BinaryVersion::k1_5;
  if ((is1_5 ? Size1_5(image) : Size1_0(image)) > kMostImageBytes) {
    throw std::length_error("the image would be larger than a dictionary may be (2 GiB)");
  }
  PutHeader(out, version, values);
  is1_5 ? PutBody1_5(out, image) : PutBody1_0(out, image);
  return {};
}

}  // namespace tovali_private
