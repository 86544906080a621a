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
    index.Put(next->Run());
  } else {
    index.Remove(found->Run());
  }
  liveBytes -= found->MemorySize();
  Unlink(*found);
  return found;
}

void DictionaryTable::Unlink(HashItem& item) noexcept {
  HashItem* const after = std::exchange(item.next, nullptr);
  HashItem* const before = std::exchange(item.previous, nullptr);
  (before != nullptr ? before->next : buckets[item.Hash(kBucketCount)]) = after;
  if (after != nullptr) after->previous = before;
}

void DictionaryTable::Insert(std::unique_ptr<DictionaryEntry> entry) {
  const uint32_t bucket = entry->Hash(kBucketCount);
  MakeRoom(bucket);
  LinkAtHead(bucket, std::move(entry), true);
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

// Oldest groups go first, and of each the last entry: what comes to the head of a chain after
// something stands before it. Should memory run out, the rest waits on.
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
  const bool canBeFound = entry->Hash(kBucketCount) == group.bucket;
  if (canBeFound) index.ReserveOne();
  const bool hides = LinkAtHead(group.bucket, std::move(entry), canBeFound);
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

// Returns whether the entry hides another one of its key.
bool DictionaryTable::LinkAtHead(uint32_t bucket, std::unique_ptr<DictionaryEntry> entry,
                                 bool canBeFound) noexcept {
  DictionaryEntry* const item = entry.release();
  item->next = buckets[bucket];
  if (item->next != nullptr) item->next->previous = item;
  buckets[bucket] = item;
  liveBytes += item->MemorySize();
  const KeyedRun* const before = canBeFound ? index.Put(item->Run()) : nullptr;
  if (before == nullptr) return false;
  item->hidden = before->entry;
  return true;
}
