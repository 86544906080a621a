#include "BinaryLoader.h"

#include <istream>
#include <memory>
#include <vector>

#include "Converters.h"
#include "DictionaryTable.h"
#include "LittleEndian.h"

namespace tovali_private {
namespace {

using Bytes = std::vector<uint8_t>;

// An image's stream, with what is left of it known beforehand.
class ImageSource {
 public:
  explicit ImageSource(std::istream& image) : stream(image) {
    stream.seekg(0, std::ios::end);
    const std::streamoff end = stream.tellg();
    stream.seekg(0);
    if (stream && end > 0) left = static_cast<uint64_t>(end);
  }

  // Reads exactly `count` bytes, or fails before it takes or allocates any.
  bool Read(Bytes& bytes, uint64_t count) {
    if (count > left || count > bytes.max_size()) return false;
    bytes.resize(static_cast<size_t>(count));
    return Read(bytes.data(), count);
  }

  bool Read(uint8_t* bytes, uint64_t count) {
    if (count > left) return false;
    stream.read(reinterpret_cast<char*>(bytes), static_cast<std::streamsize>(count));
    left -= count;
    position += count;
    return static_cast<bool>(stream);
  }

  bool Read(uint16_t& value) {
    uint8_t bytes[sizeof value];
    if (!Read(bytes, sizeof bytes)) return false;
    value = Read16(bytes);
    return true;
  }

  bool Read(uint32_t& value) {
    uint8_t bytes[sizeof value];
    if (!Read(bytes, sizeof bytes)) return false;
    value = Read32(bytes);
    return true;
  }

  uint64_t Position() const noexcept { return position; }

 private:
  std::istream& stream;
  uint64_t position = 0;
  uint64_t left = 0;
};

// Gathers the entries of one group and splices them into their bucket when the group ends, however
// it ends. Without a bucket to go to they are dropped.
class Group {
 public:
  Group(DictionaryTable& owner, uint32_t bucketIndex, LoadStatus& loadStatus)
      : table(owner), bucket(bucketIndex), status(loadStatus) {}
  Group(const Group&) = delete;
  Group& operator=(const Group&) = delete;

  ~Group() {
    if (bucket >= DictionaryTable::kBucketCount) return;
    status.entriesAdded += static_cast<uint32_t>(entries.size());
    status.entriesReplaced += table.Splice(bucket, entries);
  }

  // Whether an entry can be found in the group's bucket.
  bool Suits(const DictionaryEntry& entry) const noexcept {
    return bucket == entry.Hash(DictionaryTable::kBucketCount);
  }

  void Append(std::unique_ptr<DictionaryEntry> entry) { entries.push_back(std::move(entry)); }

 private:
  DictionaryTable& table;
  uint32_t bucket;
  LoadStatus& status;
  std::vector<std::unique_ptr<DictionaryEntry>> entries;
};

// What stands before the entry data of a version 1.5 body, as it stands there.
struct Tables1_5 {
  Bytes counts;
  Bytes lengths;
  Bytes buckets;
  uint64_t countsAt = 0;
  uint64_t bucketsAt = 0;
};

class BinaryLoader {
 public:
  BinaryLoader(DictionaryTable& owner, std::istream& image, LoadStatus& loadStatus)
      : table(owner), source(image), status(loadStatus) {}

  // Whether the body was read to its end.
  bool Load();

  // What ended Load, or else the first damage that it met.
  LoadDamage Damage() const noexcept { return damage; }
  uint64_t DamageOffset() const noexcept { return damageOffset; }

 private:
  bool LoadBody1_5();
  bool ReadTables(Tables1_5& tables);
  bool LoadGroups(const Tables1_5& tables);
  bool LoadBody1_0();
  bool LoadEntry1_0(Group& group);
  bool ReadKey(uint32_t length);
  bool ReadValue(uint32_t length) { return source.Read(valueBytes, length) || StopShort(); }
  void AppendEntry(Group& group);
  std::unique_ptr<DictionaryEntry> MakeEntry();

  void CheckBucket(uint32_t bucket, uint64_t offset);
  void Note(LoadDamage met, uint64_t offset);
  bool Stop(LoadDamage met, uint64_t offset);
  bool StopShort() { return Stop(LoadDamage::kShortRead, source.Position()); }

  DictionaryTable& table;
  ImageSource source;
  LoadStatus& status;
  LoadDamage damage = LoadDamage::kNone;
  uint64_t damageOffset = 0;
  int valueEncoding = 0;  // as stored, and the selector of its conversion

  Bytes keyBytes;  // of the entry being read
  Bytes valueBytes;
  UnicodeBuffer valueUnits;
};

bool BinaryLoader::Load() {
  Bytes header;
  if (!source.Read(header, kBinaryMagic.size() + 3)) return StopShort();
  const uint8_t* const fields = header.data() + kBinaryMagic.size();
  const int major = static_cast<int8_t>(fields[0]);
  const int minor = static_cast<int8_t>(fields[1]);
  valueEncoding = static_cast<int8_t>(fields[2]);
  status.encoding = valueEncoding == 0   ? TextEncoding::kUTF16LE
                    : valueEncoding == 1 ? TextEncoding::kUTF8
                                         : TextEncoding::kCodePage;
  if (major == 1 && minor == 5) return LoadBody1_5();
  if (major == 1 && minor == 0) return LoadBody1_0();
  return Stop(LoadDamage::kUnsupportedVersion, kBinaryMagic.size());
}

bool BinaryLoader::LoadBody1_5() {
  status.format = ImageFormat::kBinary1_5;
  Tables1_5 tables;
  return ReadTables(tables) && LoadGroups(tables);
}

bool BinaryLoader::ReadTables(Tables1_5& tables) {
  uint32_t groupCount = 0;
  if (!source.Read(groupCount)) return StopShort();
  if (groupCount == 0) return Stop(LoadDamage::kNoGroups, source.Position() - sizeof groupCount);
  tables.countsAt = source.Position();
  if (!source.Read(tables.counts, uint64_t{4} * groupCount)) return StopShort();
  const uint32_t lengthCount = Read32(&tables.counts[tables.counts.size() - 4]);
  if (!source.Read(tables.lengths, uint64_t{4} * lengthCount)) return StopShort();
  tables.bucketsAt = source.Position();
  return source.Read(tables.buckets, uint64_t{2} * groupCount) || StopShort();
}

bool BinaryLoader::LoadGroups(const Tables1_5& tables) {
  const size_t groupCount = tables.counts.size() / 4;
  const size_t lengthCount = tables.lengths.size() / 4;
  uint32_t next = 0;
  for (size_t i = 0; i < groupCount; ++i) {
    const uint32_t end = Read32(&tables.counts[4 * i]);
    if (end % 2 != 0 || end < next || end > lengthCount) {
      return Stop(LoadDamage::kBadCounts, tables.countsAt + 4 * i);
    }
    const uint32_t bucket = Read16(&tables.buckets[2 * i]);
    CheckBucket(bucket, tables.bucketsAt + 2 * i);
    Group group(table, bucket, status);
    for (; next < end; next += 2) {
      const uint8_t* const pair = &tables.lengths[size_t{4} * next];
      if (!ReadKey(Read32(pair)) || !ReadValue(Read32(pair + 4))) return false;
      AppendEntry(group);
    }
  }
  return true;
}

// Entries follow one another; offsets only tell, by their differences, where one group ends.
bool BinaryLoader::LoadBody1_0() {
  status.format = ImageFormat::kBinary1_0;
  uint16_t recordCount = 0;
  if (!source.Read(recordCount)) return StopShort();
  const uint64_t recordsAt = source.Position();
  if (recordCount == 0) return Stop(LoadDamage::kNoGroups, recordsAt - sizeof recordCount);

  constexpr size_t kRecordSize = 6;
  constexpr size_t kOffsetInRecord = 2;
  Bytes records;
  if (!source.Read(records, kRecordSize * recordCount)) return StopShort();

  uint64_t place = Read32(&records[kOffsetInRecord]);
  for (size_t at = 0; at + kRecordSize < records.size(); at += kRecordSize) {
    const uint32_t bucket = Read16(&records[at]);
    CheckBucket(bucket, recordsAt + at);
    const size_t endAt = at + kRecordSize + kOffsetInRecord;
    const uint32_t end = Read32(&records[endAt]);
    Group group(table, bucket, status);
    while (place < end) {
      const uint64_t entryAt = source.Position();
      if (!LoadEntry1_0(group)) return false;
      place += source.Position() - entryAt;
    }
    if (place != end) Note(LoadDamage::kBadOffset, recordsAt + endAt);
  }
  return true;
}

bool BinaryLoader::LoadEntry1_0(Group& group) {
  uint32_t keyLength = 0;
  if (!source.Read(keyLength)) return StopShort();
  if (!ReadKey(keyLength)) return false;
  uint32_t valueLength = 0;
  if (!source.Read(valueLength)) return StopShort();
  if (!ReadValue(valueLength)) return false;
  AppendEntry(group);
  return true;
}

bool BinaryLoader::ReadKey(uint32_t length) {
  status.damageOffset = source.Position();  // should the entry interrupt the load
  return source.Read(keyBytes, length) || StopShort();
}

void BinaryLoader::AppendEntry(Group& group) {
  const uint64_t entryAt = status.damageOffset;
  auto entry = MakeEntry();
  if (!group.Suits(*entry)) Note(LoadDamage::kWrongBucket, entryAt);
  group.Append(std::move(entry));
}

std::unique_ptr<DictionaryEntry> BinaryLoader::MakeEntry() {
  const ByteRunKey key(keyBytes.data(), static_cast<uint32_t>(keyBytes.size()), false);
  const uint8_t* value = valueBytes.data();
  size_t byteCount = valueBytes.size();
  if (valueEncoding != 0) {
    ConvertToUnicode(reinterpret_cast<const char*>(value), byteCount, valueUnits, &valueEncoding);
    value = reinterpret_cast<const uint8_t*>(valueUnits.Data());
    byteCount = size_t{valueUnits.Length()} * 2;
  }
  return std::make_unique<DictionaryEntry>(key, value, static_cast<uint32_t>(byteCount));
}

void BinaryLoader::CheckBucket(uint32_t bucket, uint64_t offset) {
  if (bucket >= DictionaryTable::kBucketCount) Note(LoadDamage::kBadBucket, offset);
}

void BinaryLoader::Note(LoadDamage met, uint64_t offset) {
  if (damage != LoadDamage::kNone) return;
  damage = met;
  damageOffset = offset;
}

bool BinaryLoader::Stop(LoadDamage met, uint64_t offset) {
  damage = met;
  damageOffset = offset;
  return false;
}

}  // namespace

int LoadBinary(DictionaryTable& table, std::istream& image, LoadStatus& status) {
  status.format = ImageFormat::kBinaryOther;
  BinaryLoader loader(table, image, status);
  const bool whole = loader.Load();
  status.damage = loader.Damage();
  status.damageOffset = loader.DamageOffset();
  return whole ? 0 : -1;
}

}  // namespace tovali_private
