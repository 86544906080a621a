// What a dictionary's table holds: keys, and keys with their translations.
#pragma once

#include <cstdint>
#include <iosfwd>
#include <span>

#include "KolvaneString.h"

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
  // are not written. A text that cannot be converted throws OVErrException. Failures of the stream
  // stay with the stream.
  virtual uint32_t Write(std::ostream& out, bool binary, const int* selector) const = 0;
  virtual uint32_t WriteKey(std::ostream& out, bool binary, const int* selector) const;
  virtual uint32_t WriteValue(std::ostream& out, bool binary, const int* selector) const;

  virtual ~HashItem() = default;

  // The bucket of a table of n buckets that the item belongs to.
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
  uint32_t Write(std::ostream& out, bool binary, const int* selector) const override;
  uint32_t Hash(uint32_t n) const noexcept override;
  bool Equals(const HashItem& other) const noexcept override;

  std::span<const uint8_t> Bytes() const noexcept { return {data, length}; }
  bool Owns() const noexcept { return owns; }

 private:
  const uint8_t* data;  // null when the length is 0
  uint32_t length;
  bool owns;
};

// A key with its translation; hashes and compares as the key does.
class DictionaryEntry final : public ByteRunKey {
 public:
  // Both copy the key. The first takes the bytes as code units in little-endian order; the second
  // decodes the text, as Unescape does.
  DictionaryEntry(const ByteRunKey& key, const uint8_t* valueBytes, uint32_t byteCount);
  DictionaryEntry(const ByteRunKey& key, const uint16_t* text, uint32_t unitCount);

  uint32_t SerializedSize() const override;
  uint32_t Write(std::ostream& out, bool binary, const int* selector) const override;
  uint32_t WriteKey(std::ostream& out, bool binary, const int* selector) const override;
  uint32_t WriteValue(std::ostream& out, bool binary, const int* selector) const override;

  const KolvaneString& Value() const noexcept { return value; }

 private:
  friend class KeyIndex;

  KolvaneString value;
  DictionaryEntry* nextInSlot = nullptr;  // these two belong to the index
  uint32_t wholeHash = 0;
};

}  // namespace tovali_private
