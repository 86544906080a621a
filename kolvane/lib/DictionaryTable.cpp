#include "DictionaryTable.h"

#include <utility>

using tovali_private::HashItem;

DictionaryTable::~DictionaryTable() {
  if (defaultDictionary == this) defaultDictionary = nullptr;
  Clear();
}

DictionaryTable::DictionaryEntry* DictionaryTable::Find(const ByteRunKey& key) noexcept {
  lastBucket = key.Hash(kBucketCount);
  DictionaryEntry* const found = index.Find(key);
  predecessor = found != nullptr ? found->previous : nullptr;
  return found;
}

std::unique_ptr<DictionaryTable::DictionaryEntry> DictionaryTable::Detach(
    const ByteRunKey& key) noexcept {
  std::unique_ptr<DictionaryEntry> found(Find(key));
  if (found == nullptr) return nullptr;
  index.Remove(*found);
  HashItem*& link = predecessor != nullptr ? predecessor->next : buckets[lastBucket];
  link = std::exchange(found->next, nullptr);
  if (link != nullptr) link->previous = predecessor;
  found->previous = nullptr;
  return found;
}

void DictionaryTable::Insert(std::unique_ptr<DictionaryEntry> entry) noexcept {
  const uint32_t bucket = entry->Hash(kBucketCount);
  LinkAtHead(bucket, std::move(entry));
}

// The last entry goes in first: what comes to the head of a chain after it stands before it.
uint32_t DictionaryTable::Splice(uint32_t bucket,
                                 std::span<std::unique_ptr<DictionaryEntry>> group) noexcept {
  uint32_t hiding = 0;
  for (size_t i = group.size(); i-- > 0;) {
    if (LinkAtHead(bucket, std::move(group[i]))) ++hiding;
  }
  return hiding;
}

void DictionaryTable::Clear() noexcept {
  index.Clear();
  for (HashItem*& head : buckets) {
    while (head != nullptr) {
      const std::unique_ptr<HashItem> item(head);
      head = item->next;
    }
  }
}

// Returns whether the entry hides another one of its key.
bool DictionaryTable::LinkAtHead(uint32_t bucket, std::unique_ptr<DictionaryEntry> entry) noexcept {
  DictionaryEntry* const item = entry.release();
  item->next = buckets[bucket];
  if (item->next != nullptr) item->next->previous = item;
  buckets[bucket] = item;
  const bool canBeFound = item->Hash(kBucketCount) == bucket;
  return canBeFound && index.Add(*item);
}
