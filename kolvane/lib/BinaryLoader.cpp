#include "kolvane/lib/BinaryLoader.h"

#include <algorithm>
#include <limits>
#include <optional>
#include <utility>

#include "kolvane/lib/ByteStreams.h"
#include "kolvane/lib/Converters.h"
#include "kolvane/lib/DictionaryReader.h"
#include "kolvane/lib/DictionaryTable.h"
#include "kolvane/lib/LittleEndian.h"
#include "kolvane/lib/StoredGroups.h"

namespace tovali_private {
namespace {

using Bytes = StoredImage::Bytes;

// Of version 1.0: a record's size, where its offset stands in it, and the size of a length.
constexpr size_t kRecordSize = 6;
constexpr size_t kOffsetInRecord = 2;
constexpr size_t kLengthSize = 4;

// An image's stream, with what is left of it known beforehand.
class ImageSource {
 public:
  explicit ImageSource(InputStream& image) : stream(image), left(image.Size()) {}

  // Reads exactly `count` bytes, or fails before it allocates any.
  bool Read(Bytes& bytes, uint64_t count) {
    if (count > left) return false;
    ReadUpTo(bytes, count);
    return bytes.size() == count;
  }

  // Reads as many bytes as there are, but at most `count`.
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

// What else stands before the entry data of a version 1.5 body, as it stands there.
struct Tables1_5 {
  Bytes counts;
  Bytes buckets;
  uint64_t countsAt = 0;
  uint64_t bucketsAt = 0;
};

// Takes an image apart into groups, with a look at lengths, but none at keys and values.
class BinaryParser {
 public:
  BinaryParser(InputStream& image, StoredImage& storedImage, LoadStatus& loadStatus)
      : source(image), stored(storedImage), status(loadStatus) {}

  // Returns whether the body was there to its end.
  bool Parse();

  // What ended the reading, or else the first damage that it met.
  LoadDamage Damage() const noexcept { return damage; }
  uint64_t DamageOffset() const noexcept { return damageOffset; }

 private:
  bool ParseBody1_5();
  bool ReadTables(Tables1_5& tables);
  bool ParseGroups1_5(const Tables1_5& tables);
  bool TakeEntries1_5(StoredGroup& group, size_t lengthsEnd);

  bool ParseBody1_0();
  bool ParseGroups1_0(const Bytes& records, uint64_t recordsAt);
  bool TakeEntries1_0(StoredGroup& group, uint64_t& place, uint32_t end);
  bool TakeEntry1_0(StoredGroup& group);
  bool TakeField1_0(std::span<const uint8_t>& field);

  void CheckBucket(uint32_t bucket, uint64_t offset);
  void Note(LoadDamage met, uint64_t offset);
  bool Stop(LoadDamage met, uint64_t offset);
  bool StopShort() { return Stop(LoadDamage::kShortRead, source.Position()); }

  ImageSource source;
  StoredImage& stored;
  LoadStatus& status;
  LoadDamage damage = LoadDamage::kNone;
  uint64_t damageOffset = 0;
  size_t taken1_0 = 0;  // bytes of a version 1.0 body
};

bool BinaryParser::Parse() {
  Bytes header;
  if (!source.Read(header, kBinaryMagic.size() + 3)) return StopShort();
  const uint8_t* const fields = header.data() + kBinaryMagic.size();
  const int major = static_cast<int8_t>(fields[0]);
  const int minor = static_cast<int8_t>(fields[1]);
  stored.valueSelector = static_cast<int8_t>(fields[2]);
  status.encoding = stored.valueSelector == 0               ? TextEncoding::kUTF16LE
                    : stored.valueSelector == kUTF8Selector ? TextEncoding::kUTF8
                                                            : TextEncoding::kCodePage;
  if (major == 1 && minor == 5) return ParseBody1_5();
  if (major == 1 && minor == 0) return ParseBody1_0();
  return Stop(LoadDamage::kUnsupportedVersion, kBinaryMagic.size());
}

bool BinaryParser::ParseBody1_5() {
  status.format = ImageFormat::kBinary1_5;
  Tables1_5 tables;
  if (!ReadTables(tables)) return false;
  uint64_t dataSize = 0;
  for (size_t at = 0; at < stored.lengths.size(); at += 4) dataSize += Read32(&stored.lengths[at]);
  stored.dataOffset = source.Position();
  source.ReadUpTo(stored.data, dataSize);
  return ParseGroups1_5(tables);
}

bool BinaryParser::ReadTables(Tables1_5& tables) {
  uint32_t groupCount = 0;
  if (!source.Read(groupCount)) return StopShort();
  if (groupCount == 0) return Stop(LoadDamage::kNoGroups, source.Position() - sizeof groupCount);
  tables.countsAt = source.Position();
  if (!source.Read(tables.counts, uint64_t{4} * groupCount)) return StopShort();
  const uint32_t lengthCount = Read32(&tables.counts[tables.counts.size() - 4]);
  if (!source.Read(stored.lengths, uint64_t{4} * lengthCount)) return StopShort();
  tables.bucketsAt = source.Position();
  return source.Read(tables.buckets, uint64_t{2} * groupCount) || StopShort();
}

bool BinaryParser::ParseGroups1_5(const Tables1_5& tables) {
  const size_t groupCount = tables.counts.size() / 4;
  const size_t entryCount = stored.lengths.size() / StoredImage::kLengthsSize;
  stored.groups.reserve(std::min(groupCount, entryCount));
  StoredGroup group;
  for (size_t i = 0; i < groupCount; ++i) {
    const uint64_t lengthsEnd = uint64_t{4} * Read32(&tables.counts[4 * i]);
    if (lengthsEnd % StoredImage::kLengthsSize != 0 || lengthsEnd < group.lengthsEnd ||
        lengthsEnd > stored.lengths.size()) {
      return Stop(LoadDamage::kBadCounts, tables.countsAt + 4 * i);
    }
    group.bucket = Read16(&tables.buckets[2 * i]);
    group.entryCount = 0;
    CheckBucket(group.bucket, tables.bucketsAt + 2 * i);
    const bool whole = TakeEntries1_5(group, static_cast<size_t>(lengthsEnd));
    if (group.entryCount != 0) stored.groups.push_back(group);
    if (!whole) return false;
  }
  return true;
}

bool BinaryParser::TakeEntries1_5(StoredGroup& group, size_t lengthsEnd) {
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

bool BinaryParser::ParseBody1_0() {
  status.format = ImageFormat::kBinary1_0;
  uint16_t recordCount = 0;
  if (!source.Read(recordCount)) return StopShort();
  const uint64_t recordsAt = source.Position();
  if (recordCount == 0) return Stop(LoadDamage::kNoGroups, recordsAt - sizeof recordCount);
  Bytes records;
  if (!source.Read(records, uint64_t{kRecordSize} * recordCount)) return StopShort();
  stored.dataOffset = source.Position() + kLengthSize;
  stored.lengthsBetween = 2 * kLengthSize;
  source.ReadUpTo(stored.data, std::numeric_limits<uint64_t>::max());
  const bool whole = ParseGroups1_0(records, recordsAt);
  stored.data.resize(stored.groups.empty() ? 0 : stored.groups.back().dataEnd);
  stored.data.shrink_to_fit();
  return whole;
}

// Entries follow one another; offsets only tell, by their differences, where one group ends.
bool BinaryParser::ParseGroups1_0(const Bytes& records, uint64_t recordsAt) {
  uint64_t place = Read32(&records[kOffsetInRecord]);
  StoredGroup group;
  for (size_t at = 0; at + kRecordSize < records.size(); at += kRecordSize) {
    const size_t endAt = at + kRecordSize + kOffsetInRecord;
    const uint32_t end = Read32(&records[endAt]);
    group.bucket = Read16(&records[at]);
    group.entryCount = 0;
    CheckBucket(group.bucket, recordsAt + at);
    const bool whole = TakeEntries1_0(group, place, end);
    if (group.entryCount != 0) stored.groups.push_back(group);
    if (!whole) return false;
    if (place != end) Note(LoadDamage::kBadOffset, recordsAt + endAt);
  }
  return true;
}

bool BinaryParser::TakeEntries1_0(StoredGroup& group, uint64_t& place, uint32_t end) {
  while (place < end) {
    const size_t entryAt = taken1_0;
    if (!TakeEntry1_0(group)) return false;
    place += taken1_0 - entryAt;
  }
  return true;
}

// Moves the entry's key and value, which stand among the lengths, up to those before them.
bool BinaryParser::TakeEntry1_0(StoredGroup& group) {
  std::span<const uint8_t> key, value;
  if (!TakeField1_0(key) || !TakeField1_0(value)) return false;
  for (const auto field : {key, value}) {
    stored.lengths.insert(stored.lengths.end(), field.data() - kLengthSize, field.data());
    std::copy(field.begin(), field.end(), stored.data.data() + group.dataEnd);
    group.dataEnd += field.size();
  }
  group.lengthsEnd += StoredImage::kLengthsSize;
  ++group.entryCount;
  return true;
}

bool BinaryParser::TakeField1_0(std::span<const uint8_t>& field) {
  const auto left = std::span<const uint8_t>(stored.data).subspan(taken1_0);
  const uint64_t offset = source.Position() - left.size();
  if (left.size() < kLengthSize) return Stop(LoadDamage::kShortRead, offset);
  const uint32_t length = Read32(left.data());
  if (length > left.size() - kLengthSize) return Stop(LoadDamage::kShortRead, offset + kLengthSize);
  field = left.subspan(kLengthSize, length);
  taken1_0 += kLengthSize + length;
  return true;
}

void BinaryParser::CheckBucket(uint32_t bucket, uint64_t offset) {
  if (bucket >= DictionaryTable::kBucketCount) Note(LoadDamage::kBadBucket, offset);
}

void BinaryParser::Note(LoadDamage met, uint64_t offset) {
  if (damage != LoadDamage::kNone) return;
  damage = met;
  damageOffset = offset;
}

bool BinaryParser::Stop(LoadDamage met, uint64_t offset) {
  damage = met;
  damageOffset = offset;
  return false;
}

// Stores the same entries with their values in UTF-16; those before a value that cannot be
// converted also when it throws. `misfiled` is where the
// first entry stands that belongs to another bucket.
void ConvertValues(const StoredImage& stored, StoredImage& converted, LoadStatus& status,
                   std::optional<uint64_t>& misfiled) {
  UnicodeBuffer units;
  const StoredGroup* current = nullptr;
  converted.keysChecked = true;
  stored.ForEachEntry([&](const StoredGroup& group, const StoredEntry& entry) {
    if (std::exchange(current, &group) != &group) converted.BeginGroup(group.bucket);
    status.damageOffset = entry.offset;  // should it interrupt the load
    ConvertToUnicode(reinterpret_cast<const char*>(entry.value.data()), entry.value.size(), units,
                     &stored.valueSelector);
    converted.Append(entry.key,
                     {reinterpret_cast<const uint8_t*>(units.Data()), size_t{units.Length()} * 2});
    const bool canBeFound = entry.Key().Hash(DictionaryTable::kBucketCount) == group.bucket;
    if (!canBeFound && !misfiled) misfiled = entry.offset;
  });
}

void DeferConverted(DictionaryTable& table, const StoredImage& stored, LoadStatus& status,
                    std::optional<uint64_t>& misfiled) {
  StoredImage converted;
  try {
    ConvertValues(stored, converted, status, misfiled);
  } catch (...) {
    table.Defer(std::move(converted));
    throw;
  }
  table.Defer(std::move(converted));
}

}  // namespace

const int* SelectorFor(TextEncoding encoding) noexcept {
  return encoding == TextEncoding::kUTF8 ? &kUTF8Selector : kDefaultSelector;
}

bool IsBinary(std::string_view image) noexcept {
  const bool isMarked = EncodingByMark(image) != TextEncoding::kCodePage;
  return image.substr(isMarked ? 2 : 0).starts_with(kBinaryMagic);
}

bool ParseBinary(InputStream& image, StoredImage& stored, LoadStatus& status) {
  status.format = ImageFormat::kBinaryOther;
  BinaryParser parser(image, stored, status);
  const bool whole = parser.Parse();
  status.damage = parser.Damage();
  status.damageOffset = parser.DamageOffset();
  return whole;
}

int LoadBinary(DictionaryTable& table, InputStream& image, LoadStatus& status) {
  StoredImage stored;
  LoadStatus parsed = status;
  const bool whole = ParseBinary(image, stored, parsed);
  status.format = parsed.format;
  status.encoding = parsed.encoding;
  std::optional<uint64_t> misfiled;
  if (parsed.encoding == TextEncoding::kUTF16LE) {
    table.Defer(std::move(stored));
  } else {
    DeferConverted(table, stored, status, misfiled);
  }
  const bool keyIsFirst = misfiled && parsed.damage == LoadDamage::kNone;
  status.damage = keyIsFirst ? LoadDamage::kWrongBucket : parsed.damage;
  status.damageOffset = keyIsFirst ? *misfiled : parsed.damageOffset;
  return whole ? 0 : -1;
}

}  // namespace tovali_private
