#include "kolvane/lib/DictionaryTable.h"

#include <utility>

using tovali_private::HashItem;
using tovali_private::KeyedRun;
using tovali_private::StoredEntry;
using tovali_private::StoredGroup;
using tovali_private::StoredImage;

DictionaryTable::~DictionaryTable() {
  if (defaultDictionary == this) defaultDictionary = nullptr;
  DestroyEntries();
}

DictionaryTable::KeyHashes DictionaryTable::HashesOf(const ByteRunKey& key) const noexcept {
  return {index.HashOf(key.Bytes()), key.Hash(kBucketCount)};
}

KeyedRun* DictionaryTable::FindRun(std::span<const uint8_t> key) {
  if (waiting.Any()) {
    const ByteRunKey probe(key.data(), static_cast<uint32_t>(key.size()), false);
    Settle(probe.Hash(kBucketCount));
  }
  return index.Find(key);
}

DictionaryTable::DictionaryEntry* DictionaryTable::Find(const ByteRunKey& key) {
  const KeyedRun* const run = FindRun(key.Bytes());
  return run != nullptr ? run->entry : nullptr;
}

std::unique_ptr<DictionaryTable::DictionaryEntry> DictionaryTable::Detach(const ByteRunKey& key) {
  std::unique_ptr<DictionaryEntry> found(Find(key));
  if (found == nullptr) return nullptr;
  if (const DictionaryEntry* const next = std::exchange(found->hidden, nullptr)) {
    index.Put(next->Run(), index.HashOf(key.Bytes()));
  } else {
    index.Remove(found->Run());
  }
  Unlink(*found);
  return found;
}

void DictionaryTable::Unlink(DictionaryEntry& entry) noexcept {
  liveBytes -= entry.MemorySize();
  HashItem* const after = std::exchange(entry.next, nullptr);
  HashItem* const before = std::exchange(entry.previous, nullptr);
  (before != nullptr ? before->next : buckets[entry.Hash(kBucketCount)]) = after;
  if (after != nullptr) after->previous = before;
}

void DictionaryTable::Insert(std::unique_ptr<DictionaryEntry> entry) {
  const KeyHashes key = HashesOf(*entry);
  MakeRoom(key.bucket);
  MakeFindable(LinkAtHead(key.bucket, std::move(entry)), key.inIndex);
}

void DictionaryTable::MakeRoom(uint32_t bucket) {
  if (waiting.Any()) Settle(bucket);
  index.ReserveOne();
}

const LoadStatus& DictionaryTable::LastLoad() {
  for (uint32_t bucket = 0; waiting.Any() && bucket < kBucketCount; ++bucket) Settle(bucket);
  return lastLoad.Status();
}

const HashItem* DictionaryTable::Bucket(uint32_t bucket) {
  Settle(bucket);
  return buckets[bucket];
}

// Entries are prepended, so the oldest group comes first, and of each group its last entry. On
// std::bad_alloc the rest stays pending.
void DictionaryTable::Settle(uint32_t bucket) {
  while (StoredGroup* const group = waiting.Oldest(bucket)) {
    while (group->entryCount != 0) SettleLastOf(*group);
    waiting.DropOldest(bucket);
  }
}

void DictionaryTable::SettleLastOf(StoredGroup& group) {
  const StoredImage& image = *group.image;
  const StoredEntry stored = image.LastOf(group);
  auto entry = DictionaryEntry::Create(memory, stored.Key(), stored.value);
  const KeyHashes key = HashesOf(*entry);
  const bool canBeFound = key.bucket == group.bucket;
  if (canBeFound) index.ReserveOne();
  DictionaryEntry& linked = LinkAtHead(group.bucket, std::move(entry));
  const bool hides = canBeFound && MakeFindable(linked, key.inIndex);
  image.DropLastOf(group);
  if (image.load != lastLoad.Number()) return;
  if (hides) lastLoad.CountReplaced();
  if (!canBeFound && !image.keysChecked) lastLoad.NoteWrongBucket(stored.offset);
}

void DictionaryTable::Clear() noexcept {
  waiting.Clear();
  index.Clear();
  DestroyEntries();
}

void DictionaryTable::DestroyEntries() noexcept {
  for (HashItem*& head : buckets) {
    while (head != nullptr) {
      const std::unique_ptr<HashItem> item(head);
      head = item->next;
    }
  }
  liveBytes = 0;
}

DictionaryTable::DictionaryEntry& DictionaryTable::LinkAtHead(
    uint32_t bucket, std::unique_ptr<DictionaryEntry> entry) noexcept {
  DictionaryEntry* const item = entry.release();
  item->next = buckets[bucket];
  if (item->next != nullptr) item->next->previous = item;
  buckets[bucket] = item;
  liveBytes += item->MemorySize();
  return *item;
}

// Indexes a linked entry. Returns whether it hides an older one of its key.
bool DictionaryTable::MakeFindable(DictionaryEntry& entry, uint32_t hash) noexcept {
  const KeyedRun* const older = index.Put(entry.Run(), hash);
  if (older != nullptr) entry.hidden = older->entry;
  return older != nullptr;
}

void DictionaryTable::DestroyHidden(DictionaryEntry& entry) noexcept {
  const std::unique_ptr<DictionaryEntry> older(entry.hidden);
  entry.hidden = older->hidden;
  Unlink(*older);
}
