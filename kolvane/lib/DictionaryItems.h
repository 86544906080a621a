// The items on a table's chains: keys, and entries with key and value.
#pragma once

#include <cstdint>
#include <cstring>
#include <memory>
#include <span>

#include "kolvane/lib/Arena.h"
#include "kolvane/lib/ByteStreams.h"
#include "kolvane/lib/KolvaneString.h"

namespace tovali_private {

// The base of everything on a table's chains. An item is on at most one chain of one table, which
// then owns it.
class HashItem {
 public:
  HashItem() = default;
  HashItem(const HashItem&) = delete;
  HashItem& operator=(const HashItem&) = delete;

  // The bytes that the item takes in a binary dictionary with UTF-16 values, lengths not counted.
  virtual uint32_t SerializedSize() const = 0;

  // Write, WriteKey and WriteValue write the item, its key or its value, and return the number of
  // bytes written. In text form (binary is false) that is one line of little-endian UTF-16,
  // `"key=value"` CR LF, of which WriteKey writes what ends with the `=`, and WriteValue the rest.
  // In binary form keys are written as they are, values as UTF-16 in little-endian order where the
  // selector is null, else as multibyte text in the code page that it names (Converters.h); lengths
  // are not written. A text that cannot be converted throws OVErrException; what the stream throws
  // passes.
  virtual uint32_t Write(OutputStream& out, bool binary, const int* selector) const = 0;
  virtual uint32_t WriteKey(OutputStream& out, bool binary, const int* selector) const;
  virtual uint32_t WriteValue(OutputStream& out, bool binary, const int* selector) const;

  virtual ~HashItem() = default;

  // The bucket of a table of n buckets that the item belongs to; n is at most 2^27.
  virtual uint32_t Hash(uint32_t n) const noexcept = 0;

  // Whether the item has this key; `other` is always a ByteRunKey.
  virtual bool Equals(const HashItem& other) const noexcept = 0;

  // The neighbours on the chain; null at its ends and in an item that is on none.
  HashItem* next = nullptr;
  HashItem* previous = nullptr;
};

// A key: bytes, compared exactly.
class ByteRunKey : public HashItem {
 public:
  // With `copy` the key owns a copy of the bytes; without, it borrows them and must not outlive
  // them.
  ByteRunKey(const uint8_t* bytes, uint32_t byteCount, bool copy);
  ByteRunKey(const ByteRunKey& other);  // always owns its copy
  ~ByteRunKey() override;

  // An empty key writes nothing, in text form either.
  uint32_t SerializedSize() const override { return length; }
  uint32_t Write(OutputStream& out, bool binary, const int* selector) const override;
  uint32_t Hash(uint32_t n) const noexcept override;
  bool Equals(const HashItem& other) const noexcept final;

  std::span<const uint8_t> Bytes() const noexcept { return {data, length}; }
  bool Owns() const noexcept { return storage != Storage::kBorrowed; }

 protected:
  enum class Storage : uint8_t { kBorrowed, kAllocated, kWithValue };

  ByteRunKey(const uint8_t* bytes, uint32_t byteCount, Storage where) noexcept
      : data(byteCount == 0 ? nullptr : bytes), length(byteCount), storage(where) {}

 private:
  const uint8_t* data;  // null when the length is 0
  uint32_t length;
  Storage storage;
};

inline bool ByteRunKey::Equals(const HashItem& other) const noexcept {
  const auto& key = static_cast<const ByteRunKey&>(other);
  return length == key.length && (length == 0 || std::memcmp(data, key.data, length) == 0);
}

class DictionaryEntry;

// The value of an entry, with its key stored before it, so that a lookup touches one block.
class KeyedRun final : public ByteRunValue {
 public:
  // Copies both. The initial reference count is 0. Throws: std::bad_alloc.
  static KeyedRun* Create(Arena& arena, std::span<const uint8_t> key,
                          std::span<const uint8_t> bytes);

  std::span<const uint8_t> Key() const noexcept { return {KeyBytes(), keyLength}; }

  static void operator delete(void* block) noexcept { Arena::Free(block); }

 private:
  KeyedRun(uint32_t lengthOfKey, uint32_t byteCount, uint32_t offset) noexcept
      : ByteRunValue(byteCount, offset), keyLength(lengthOfKey) {}
  ~KeyedRun() override = default;

  const uint8_t* KeyBytes() const noexcept { return reinterpret_cast<const uint8_t*>(this + 1); }

  uint32_t keyLength;  // in the padding after the base

 public:
  DictionaryEntry* entry = nullptr;  // null after the entry is destroyed
};

// Separate arenas for hot data (keys and values) and cold data (entries). May be destroyed before
// the objects allocated from it.
struct EntryMemory {
  // Size hint: the bytes of the text or of the entries that will be allocated.
  void Expect(uint64_t byteCount) noexcept {
    runs.Expect(byteCount);
    entries.Expect(byteCount / 2);
  }

  uint64_t HeldBytes() const noexcept { return runs.HeldBytes() + entries.HeldBytes(); }

  Arena runs;
  Arena entries;
};

// A key with its translation; hashes and compares as the key does.
class DictionaryEntry final : public ByteRunKey {
 public:
  // Both copy the key. The first takes the bytes as code units in little-endian order; the second
  // decodes the text, as Unescape does.
  static std::unique_ptr<DictionaryEntry> Create(EntryMemory& memory, const ByteRunKey& key,
                                                 std::span<const uint8_t> valueBytes);
  static std::unique_ptr<DictionaryEntry> Create(EntryMemory& memory, const ByteRunKey& key,
                                                 std::span<const uint16_t> text);

  // Returns an entry with the same key and value, on no chain.
  std::unique_ptr<DictionaryEntry> CopyIn(EntryMemory& memory) const;

  ~DictionaryEntry() override { run.entry = nullptr; }
  static void operator delete(void* entry) noexcept { Arena::Free(entry); }

  uint32_t SerializedSize() const override;
  uint32_t Write(OutputStream& out, bool binary, const int* selector) const override;
  uint32_t WriteKey(OutputStream& out, bool binary, const int* selector) const override;
  uint32_t WriteValue(OutputStream& out, bool binary, const int* selector) const override;

  // Approximate bytes allocated from EntryMemory.
  uint64_t MemorySize() const noexcept;

  const KolvaneString& Value() const noexcept { return value; }
  KeyedRun& Run() const noexcept { return run; }

  // The entry of the same key that this one shadows, or null. Maintained by the table.
  DictionaryEntry* hidden = nullptr;

 private:
  explicit DictionaryEntry(KeyedRun& keyedRun) noexcept;

  KeyedRun& run;
  KolvaneString value;
};

}  // namespace tovali_private
