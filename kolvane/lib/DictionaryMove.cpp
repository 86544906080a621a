// Compaction of sparse entry memory.
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

// O(live entries), amortised: at least 3 times their size was allocated since the last compaction.
// If memory runs out, the remaining entries stay where they are.
void DictionaryTable::MoveFromMostlyDeadMemory() noexcept {
  constexpr uint64_t kMostHeld = 4;
  constexpr uint64_t kLittle = uint64_t{1} << 16;
  if (memory.HeldBytes() <= kMostHeld * liveBytes + kLittle) return;
  try {
    memory = EntryMemory();
    memory.Expect(liveBytes);
    for (HashItem*& head : buckets) MoveChain(head);
  } catch (const std::bad_alloc&) {  // the entries copied so far are consistent
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

// While a chain is copied, each old run's `entry` is the forwarding pointer to its copy.
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
