// What a dictionary does about memory that is held by few entries among many that are gone.
#include <memory>
#include <new>
#include <utility>
#include <vector>

#include "kolvane/lib/DictionaryTable.h"

using tovali_private::DictionaryEntry;
using tovali_private::EntryMemory;
using tovali_private::HashItem;

namespace {

DictionaryEntry& EntryOf(HashItem& item) noexcept {
  return static_cast<DictionaryEntry&>(item);
}

}  // namespace

// A move takes time in proportion to the entries that it moves, and there is none before chunks of
// three times their size were begun since the last. Where memory runs out, the other entries stay.
void DictionaryTable::MoveFromMostlyDeadMemory() noexcept {
  constexpr uint64_t kMostHeld = 4;
  constexpr uint64_t kLittle = uint64_t{1} << 16;
  if (memory.HeldBytes() <= kMostHeld * liveBytes + kLittle) return;
  try {
    memory = EntryMemory();
    memory.Expect(liveBytes);
    for (HashItem*& head : buckets) MoveChain(head);
  } catch (const std::bad_alloc&) {  // what is moved already is in its place
  }
}

void DictionaryTable::MoveChain(HashItem*& head) {
  std::vector<std::unique_ptr<DictionaryEntry>> copies;
  for (HashItem* item = head; item != nullptr; item = item->next) {
    copies.push_back(EntryOf(*item).CopyIn(memory));
  }
  auto copy = copies.begin();
  for (HashItem* item = head; item != nullptr; item = item->next) {
    index.Replace(EntryOf(*item).Run(), (*copy)->Run());
    EntryOf(*item).Run().entry = (copy++)->release();
  }
  ReplaceByMoved(head);
}

// The run of each entry names the one that takes its place.
void DictionaryTable::ReplaceByMoved(HashItem*& head) noexcept {
  HashItem* last = nullptr;
  for (HashItem* item = std::exchange(head, nullptr); item != nullptr;) {
    const std::unique_ptr<HashItem> replaced(item);
    DictionaryEntry* const moved = EntryOf(*item).Run().entry;
    const DictionaryEntry* const hidden = EntryOf(*item).hidden;
    moved->hidden = hidden != nullptr ? hidden->Run().entry : nullptr;
    moved->previous = last;
    (last != nullptr ? last->next : head) = moved;
    last = moved;
    item = item->next;
  }
}
