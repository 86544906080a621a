// The table behind KolvaneDictionary: entries in 1021 buckets, with an index by key.
//
// DictionaryTable.cpp stores entries, DictionaryLoad.cpp loads images, DictionaryLookup.cpp
// translates keys, and DictionaryMove.cpp compacts sparse memory.
#pragma once

#include <cstdint>
#include <iosfwd>
#include <memory>
#include <span>

#include "kolvane/lib/DictionaryItems.h"
#include "kolvane/lib/KeyIndex.h"
#include "kolvane/lib/LoadRecord.h"
#include "kolvane/lib/StoredGroups.h"
#include "kolvane/lib/TranslatedString.h"

namespace tovali_private {
class DictionaryReader;
class InputStream;
}  // namespace tovali_private

// Owns its entries; pointers to them are valid until the next load. Not synchronised: even a lookup
// writes to the table, and values have plain reference counts.
//
// The memory of a replaced entry is freed with its chunk, or by compaction after a text load: if
// more is reserved than 4 times the live bytes plus 64 KB, entries are copied to new memory.
class DictionaryTable {
 public:
  using DictionaryEntry = tovali_private::DictionaryEntry;
  using ByteRunKey = tovali_private::ByteRunKey;

  static constexpr uint32_t kBucketCount = tovali_private::WaitingGroups::kBucketCount;

  DictionaryTable() = default;
  DictionaryTable(const DictionaryTable&) = delete;
  DictionaryTable& operator=(const DictionaryTable&) = delete;

  // If this table is the default dictionary, there is none afterwards.
  ~DictionaryTable();

  // Adds the entries of one image, text or binary. Damage is reported by LastLoad only. Time and
  // memory are linear in the image's size. Requires: the stream is at its start and can seek back
  // there. Throws: OVErrException if a conversion fails, std::bad_alloc; what was stored before
  // stays.
  void Load(tovali_private::InputStream& image);
  void Load(std::istream& image);

  // Returns the result of the latest load, also of one that threw; valid until the next load.
  // Materialises all pending buckets first. Throws: std::bad_alloc.
  const LoadStatus& LastLoad();

  // Makes this the process-wide default dictionary, where other tables look up the keys that they
  // lack. The caller keeps ownership.
  void MakeDefault() noexcept;

  // As KolvaneDictionary::Translate. The first lookup in a bucket materialises its pending entries.
  TranslatedString Translate(const char* text, const int* selector);

  // Stores the definition of a text line (TextSyntax.h) and replaces an earlier one of its key. An
  // exception leaves the table unchanged.
  StoredLine StoreLine(std::span<const uint16_t> line);

  // These work on the table's chains, and may have to make a bucket's entries first that a binary
  // image left there; when that throws std::bad_alloc they have done nothing else.

  // The first entry of the key's bucket that has this key, or null.
  DictionaryEntry* Find(const ByteRunKey& key);

  // Takes out what Find finds; an equal key behind it is found from then on.
  std::unique_ptr<DictionaryEntry> Detach(const ByteRunKey& key);

  // Puts an entry at the head of its bucket, in front of any of the same key. Destroys it when it
  // throws.
  void Insert(std::unique_ptr<DictionaryEntry> entry);

  // Returns the first item of a bucket's chain, or null.
  const tovali_private::HashItem* Bucket(uint32_t bucket);

  // Destroys every entry.
  void Clear() noexcept;

 private:
  class MoveAtEnd;

  // Both hashes of a key, computed once for all steps of a change.
  struct KeyHashes {
    uint32_t inIndex;
    uint32_t bucket;
  };

  KeyHashes HashesOf(const ByteRunKey& key) const noexcept;
  tovali_private::KeyedRun* FindRun(std::span<const uint8_t> key);
  void Settle(uint32_t bucket);
  void MakeRoom(uint32_t bucket);
  void DestroyEntries() noexcept;
  void SettleLastOf(tovali_private::StoredGroup& group);
  DictionaryEntry& LinkAtHead(uint32_t bucket, std::unique_ptr<DictionaryEntry> entry) noexcept;
  bool MakeFindable(DictionaryEntry& entry, uint32_t hash) noexcept;
  void DestroyHidden(DictionaryEntry& entry) noexcept;
  void Unlink(DictionaryEntry& entry) noexcept;
  void MoveFromMostlyDeadMemory() noexcept;
  void MoveChain(tovali_private::HashItem*& head);
  static void ReplaceByMoved(tovali_private::HashItem*& head) noexcept;
  void LoadText(tovali_private::InputStream& image, tovali_private::DictionaryReader& reader);
  void LoadBinary(tovali_private::InputStream& image);
  void Adopt(tovali_private::StoredImage&& image);

  tovali_private::EntryMemory memory;
  uint64_t liveBytes = 0;  // the size of all entries

  // The chains are authoritative, except for buckets with pending groups. The index finds the entry
  // that a walk from the head of a chain would find first.
  tovali_private::HashItem* buckets[kBucketCount] = {};
  tovali_private::WaitingGroups waiting;
  tovali_private::KeyIndex index;

  tovali_private::LoadRecord lastLoad;

  static DictionaryTable* defaultDictionary;  // owned by whoever owns the table
};
