#include "kolvane/lib/BinaryParser.h"

#include <algorithm>
#include <limits>
#include <utility>

#include "kolvane/lib/ByteStreams.h"
#include "kolvane/lib/Converters.h"
#include "kolvane/lib/DictionaryReader.h"
#include "kolvane/lib/LittleEndian.h"
#include "platform/Unicode.h"

namespace tovali_private {
namespace {

using Bytes = StoredImage::Bytes;

// An image's stream, whose remaining size is known in advance.
class ImageSource {
 public:
  explicit ImageSource(InputStream& image) : stream(image), left(image.Size()) {}

  // Reads exactly `count` bytes. Fails before it allocates if the stream has fewer.
  bool Read(Bytes& bytes, uint64_t count) {
    if (count > left) return false;
    ReadUpTo(bytes, count);
    return bytes.size() == count;
  }

  // Reads up to `count` bytes; fewer only at the end of the stream.
  void ReadUpTo(Bytes& bytes, uint64_t count) {
    const uint64_t wanted = std::min(count, left);
    if (wanted > bytes.max_size()) throw std::bad_alloc();
    bytes.resize(static_cast<size_t>(wanted), boost::container::default_init);
    bytes.resize(stream.Read(bytes));
    left -= bytes.size();
    position += bytes.size();
  }

  bool Read(uint16_t& value) {
    uint8_t bytes[sizeof value];
    if (!Read(bytes)) return false;
    value = Read16(bytes);
    return true;
  }

  bool Read(uint32_t& value) {
    uint8_t bytes[sizeof value];
    if (!Read(bytes)) return false;
    value = Read32(bytes);
    return true;
  }

  uint64_t Position() const noexcept { return position; }

 private:
  bool Read(std::span<uint8_t> bytes) {
    if (bytes.size() > left) return false;
    const size_t count = stream.Read(bytes);
    left -= count;
    position += count;
    return count == bytes.size();
  }

  InputStream& stream;
  uint64_t position = 0;
  uint64_t left;
};

// The parts that both versions share: where the bytes come from, where the result goes, and the
// damage that is met.
class Parser {
 public:
  Parser(ImageSource& image, ParsedImage& result) noexcept
      : source(image), parsed(result), stored(result.stored) {}

 protected:
  void CheckBucket(uint32_t bucket, uint64_t offset) noexcept {
    if (bucket >= WaitingGroups::kBucketCount) Note(LoadDamage::kBadBucket, offset);
  }

  // Records damage that parsing survives; the first one counts.
  void Note(LoadDamage kind, uint64_t offset) noexcept {
    if (parsed.damage.kind == LoadDamage::kNone) parsed.damage = {kind, offset};
  }

  // Records damage that ends parsing. Returns false, for the caller to return.
  bool Stop(LoadDamage kind, uint64_t offset) noexcept {
    parsed.damage = {kind, offset};
    return false;
  }
  bool StopShort() noexcept { return Stop(LoadDamage::kShortRead, source.Position()); }

  void AddGroup(const StoredGroup& group) {
    if (group.entryCount != 0) stored.groups.push_back(group);
  }

  ImageSource& source;
  ParsedImage& parsed;
  StoredImage& stored;
};

// A body whose counts, lengths and buckets are tables before the entry data.
class Parser1_5 : Parser {
 public:
  using Parser::Parser;

  void Parse();

 private:
  bool ReadTables();
  void ParseGroups();
  bool TakeEntries(StoredGroup& group, size_t lengthsEnd);

  Bytes counts;
  Bytes buckets;
  uint64_t countsAt = 0;  // offsets of both in the image
  uint64_t bucketsAt = 0;
};

void Parser1_5::Parse() {
  parsed.format = ImageFormat::kBinary1_5;
  if (!ReadTables()) return;
  uint64_t dataSize = 0;
  for (size_t at = 0; at < stored.lengths.size(); at += 4) dataSize += Read32(&stored.lengths[at]);
  stored.dataOffset = source.Position();
  source.ReadUpTo(stored.data, dataSize);
  ParseGroups();
}

bool Parser1_5::ReadTables() {
  uint32_t groupCount = 0;
  if (!source.Read(groupCount)) return StopShort();
  if (groupCount == 0) return Stop(LoadDamage::kNoGroups, source.Position() - sizeof groupCount);
  countsAt = source.Position();
  if (!source.Read(counts, uint64_t{4} * groupCount)) return StopShort();
  const uint32_t lengthCount = Read32(&counts[counts.size() - 4]);
  if (!source.Read(stored.lengths, uint64_t{4} * lengthCount)) return StopShort();
  bucketsAt = source.Position();
  return source.Read(buckets, uint64_t{2} * groupCount) || StopShort();
}

void Parser1_5::ParseGroups() {
  const size_t groupCount = counts.size() / 4;
  const size_t entryCount = stored.lengths.size() / StoredImage::kLengthsSize;
  stored.groups.reserve(std::min(groupCount, entryCount));
  StoredGroup group;
  bool continues = true;
  for (size_t i = 0; continues && i < groupCount; ++i) {
    const uint64_t lengthsEnd = uint64_t{4} * Read32(&counts[4 * i]);
    if (lengthsEnd % StoredImage::kLengthsSize != 0 || lengthsEnd < group.lengthsEnd ||
        lengthsEnd > stored.lengths.size()) {
      Stop(LoadDamage::kBadCounts, countsAt + 4 * i);
      return;
    }
    group.bucket = Read16(&buckets[2 * i]);
    group.entryCount = 0;
    CheckBucket(group.bucket, bucketsAt + 2 * i);
    continues = TakeEntries(group, static_cast<size_t>(lengthsEnd));
    AddGroup(group);
  }
}

bool Parser1_5::TakeEntries(StoredGroup& group, size_t lengthsEnd) {
  for (; group.lengthsEnd < lengthsEnd; group.lengthsEnd += StoredImage::kLengthsSize) {
    const uint8_t* const lengths = &stored.lengths[group.lengthsEnd];
    const size_t keyLength = Read32(lengths);
    const size_t valueLength = Read32(lengths + 4);
    const size_t left = stored.data.size() - group.dataEnd;
    const uint64_t offset = stored.dataOffset + group.dataEnd;
    if (keyLength > left) return Stop(LoadDamage::kShortRead, offset);
    if (valueLength > left - keyLength) return Stop(LoadDamage::kShortRead, offset + keyLength);
    group.dataEnd += keyLength + valueLength;
    ++group.entryCount;
  }
  return true;
}

// A body whose lengths stand before each key and value. It is read into `stored.data` whole and
// compacted in place: keys and values move left over the lengths, which move to `stored.lengths`.
class Parser1_0 : Parser {
 public:
  using Parser::Parser;

  void Parse();

 private:
  static constexpr size_t kRecordSize = 6;
  static constexpr size_t kOffsetInRecord = 2;
  static constexpr size_t kLengthSize = 4;

  void ParseGroups(const Bytes& records, uint64_t recordsAt);
  bool TakeEntries(StoredGroup& group, uint64_t& position, uint32_t end);
  bool TakeEntry(StoredGroup& group);
  bool TakeField(std::span<const uint8_t>& field);

  size_t consumed = 0;  // bytes of the entry data
};

void Parser1_0::Parse() {
  parsed.format = ImageFormat::kBinary1_0;
  uint16_t recordCount = 0;
  if (!source.Read(recordCount)) {
    StopShort();
    return;
  }
  const uint64_t recordsAt = source.Position();
  Bytes records;
  if (recordCount == 0) {
    Stop(LoadDamage::kNoGroups, recordsAt - sizeof recordCount);
  } else if (!source.Read(records, uint64_t{kRecordSize} * recordCount)) {
    StopShort();
  } else {
    stored.dataOffset = source.Position() + kLengthSize;
    stored.lengthsBetween = 2 * kLengthSize;
    source.ReadUpTo(stored.data, std::numeric_limits<uint64_t>::max());
    ParseGroups(records, recordsAt);
    stored.data.resize(stored.groups.empty() ? 0 : stored.groups.back().dataEnd);
    stored.data.shrink_to_fit();
  }
}

// Entries are contiguous. Offsets matter only by their differences, which give each group's end.
void Parser1_0::ParseGroups(const Bytes& records, uint64_t recordsAt) {
  uint64_t position = Read32(&records[kOffsetInRecord]);
  StoredGroup group;
  bool continues = true;
  for (size_t at = 0; continues && at + kRecordSize < records.size(); at += kRecordSize) {
    const size_t endAt = at + kRecordSize + kOffsetInRecord;
    const uint32_t end = Read32(&records[endAt]);
    group.bucket = Read16(&records[at]);
    group.entryCount = 0;
    CheckBucket(group.bucket, recordsAt + at);
    continues = TakeEntries(group, position, end);
    AddGroup(group);
    if (continues && position != end) Note(LoadDamage::kBadOffset, recordsAt + endAt);
  }
}

bool Parser1_0::TakeEntries(StoredGroup& group, uint64_t& position, uint32_t end) {
  while (position < end) {
    const size_t entryAt = consumed;
    if (!TakeEntry(group)) return false;
    position += consumed - entryAt;
  }
  return true;
}

bool Parser1_0::TakeEntry(StoredGroup& group) {
  std::span<const uint8_t> key, value;
  if (!TakeField(key) || !TakeField(value)) return false;
  for (const auto field : {key, value}) {
    stored.lengths.insert(stored.lengths.end(), field.data() - kLengthSize, field.data());
    std::copy(field.begin(), field.end(), stored.data.data() + group.dataEnd);
    group.dataEnd += field.size();
  }
  group.lengthsEnd += StoredImage::kLengthsSize;
  ++group.entryCount;
  return true;
}

bool Parser1_0::TakeField(std::span<const uint8_t>& field) {
  const auto left = std::span<const uint8_t>(stored.data).subspan(consumed);
  const uint64_t offset = source.Position() - left.size();
  if (left.size() < kLengthSize) return Stop(LoadDamage::kShortRead, offset);
  const uint32_t length = Read32(left.data());
  if (length > left.size() - kLengthSize) return Stop(LoadDamage::kShortRead, offset + kLengthSize);
  field = left.subspan(kLengthSize, length);
  consumed += kLengthSize + length;
  return true;
}

TextEncoding EncodingOf(int encodingByte) noexcept {
  if (encodingByte == 0) return TextEncoding::kUTF16LE;
  return encodingByte == kUTF8Selector ? TextEncoding::kUTF8 : TextEncoding::kCodePage;
}

void ConvertValuesInto(ConvertedImage& converted, const StoredImage& stored) {
  UnicodeBuffer units;
  const StoredGroup* current = nullptr;
  stored.ForEachEntry([&](const StoredGroup& group, const StoredEntry& entry) {
    if (std::exchange(current, &group) != &group) converted.stored.BeginGroup(group.bucket);
    converted.failureOffset = entry.offset;
    ConvertToUnicode(reinterpret_cast<const char*>(entry.value.data()), entry.value.size(), units,
                     &stored.valueSelector);
    converted.stored.Append(
        entry.key, {reinterpret_cast<const uint8_t*>(units.Data()), size_t{units.Length()} * 2});
    const bool isMisfiled = entry.Key().Hash(WaitingGroups::kBucketCount) != group.bucket;
    if (isMisfiled && converted.misfiled.kind == LoadDamage::kNone) {
      converted.misfiled = {LoadDamage::kWrongBucket, entry.offset};
    }
  });
}

}  // namespace

const int* SelectorFor(TextEncoding encoding) noexcept {
  return encoding == TextEncoding::kUTF8 ? &kUTF8Selector : kDefaultSelector;
}

bool HasBinaryMagic(std::string_view image) noexcept {
  const bool isMarked = EncodingFromBOM(image) != TextEncoding::kCodePage;
  return image.substr(isMarked ? platform::kBOMUTF16LE.size() : 0).starts_with(kBinaryMagic);
}

ParsedImage ParseBinary(InputStream& image) {
  ParsedImage parsed;
  ImageSource source(image);
  Bytes header;
  if (!source.Read(header, kBinaryMagic.size() + 3)) {
    parsed.damage = {LoadDamage::kShortRead, source.Position()};
    return parsed;
  }
  const uint8_t* const fields = header.data() + kBinaryMagic.size();
  const uint8_t major = fields[0], minor = fields[1];
  parsed.stored.valueSelector = static_cast<int8_t>(fields[2]);
  parsed.encoding = EncodingOf(parsed.stored.valueSelector);
  if (major == 1 && minor == 5) {
    Parser1_5(source, parsed).Parse();
  } else if (major == 1 && minor == 0) {
    Parser1_0(source, parsed).Parse();
  } else {
    parsed.damage = {LoadDamage::kUnsupportedVersion, kBinaryMagic.size()};
  }
  return parsed;
}

ConvertedImage ConvertValues(const StoredImage& stored) noexcept {
  ConvertedImage converted;
  converted.stored.keysChecked = true;
  try {
    ConvertValuesInto(converted, stored);
  } catch (...) {
    converted.failure = std::current_exception();
  }
  return converted;
}

}  // namespace tovali_private
