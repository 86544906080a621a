// The dictionary proper: entries in 1021 buckets, found by key, loaded from images.
//
// DictionaryTable.cpp keeps the entries, DictionaryLoad.cpp is the road of an image in,
// DictionaryLookup.cpp the road of a key through, and DictionaryMove.cpp keeps their memory small.
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

// Owns its entries. Not for concurrent use: even a lookup writes to the table, and values are
// shared with plain reference counts. The memory of an entry that is replaced comes back with that
// of the entries that were made next to it, and at the end of a text load at the latest: entries
// move there to fresh memory, as far as there is any, when more than four times as much is held for
// them as they take, and 64 KB. Pointers to entries are good until the next load.
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

  // How the latest load went, one that threw included; valid until the next one. To know it all, it
  // looks into every bucket. Throws std::bad_alloc.
  const LoadStatus& LastLoad();

  // Makes this the process's default dictionary, in which every table looks for what it lacks. The
  // table stays with its owner.
  void MakeDefault() noexcept;

  // Translates UTF-8 text of the form `$$$/Key=Default text`: the value that this table or else the
  // default dictionary has for the key, or else the default text, decoded. The result is empty when
  // there is none of them, for null, for an empty text, and for one that begins with `$` but not
  // `$$$`.
  //
  // The selector (Converters.h) says what the default text is encoded in; with null and 0 each of
  // its bytes becomes the unit of the same value. Keys are compared as bytes. Throws OVErrException
  // when the default text cannot be converted, and std::bad_alloc. The first lookup in a bucket
  // also takes what it takes to make the entries that a binary image has there.
  TranslatedString Translate(const char* text, const int* selector);

  // Puts the definition of one line of text (TextSyntax.h) in place of the one that its key had.
  // When it throws, the table is as it was.
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

  // The first item of a bucket's chain, or null.
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
  uint64_t liveBytes = 0;  // what the entries take

  // The chains are the truth, as far as no group waits for its bucket. The index finds what a walk
  // from a chain's head would find first.
  tovali_private::HashItem* buckets[kBucketCount] = {};
  tovali_private::WaitingGroups waiting;
  tovali_private::KeyIndex index;

  tovali_private::LoadRecord lastLoad;

  static DictionaryTable* defaultDictionary;  // owned by whoever owns the table
};
