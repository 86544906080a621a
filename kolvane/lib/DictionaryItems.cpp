#include "kolvane/lib/DictionaryItems.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <memory>
#include <vector>

#include "kolvane/lib/Converters.h"
#include "kolvane/lib/TextSyntax.h"

namespace tovali_private {
namespace {

uint32_t WriteBytes(OutputStream& out, const void* bytes, size_t byteCount) {
  out.Write({static_cast<const uint8_t*>(bytes), byteCount});
  return static_cast<uint32_t>(byteCount);
}

uint32_t WriteUnits(OutputStream& out, std::span<const uint16_t> units) {
  return WriteBytes(out, units.data(), units.size_bytes());
}

uint32_t WriteTextValue(OutputStream& out, std::span<const uint16_t> value) {
  static constexpr uint16_t kLineEnd[] = {'"', '\r', '\n'};
  const auto escaped = EscapeForText(value);
  const uint32_t written = WriteUnits(out, escaped ? std::span<const uint16_t>(*escaped) : value);
  return written + WriteUnits(out, kLineEnd);
}

uint32_t WriteMultiByteValue(OutputStream& out, const KolvaneString& value, const int* selector) {
  const int size = CountMultiByte(value.Data(), value.Length(), selector);
  std::vector<char> bytes(static_cast<size_t>(size));
  ConvertToMultiByte(value.Data(), value.Length(), bytes.data(), size, selector);
  return WriteBytes(out, bytes.data(), bytes.size() - 1);
}

const uint8_t* CopyOf(std::span<const uint8_t> bytes) {
  if (bytes.empty()) return nullptr;
  auto copy = std::make_unique_for_overwrite<uint8_t[]>(bytes.size());
  std::memcpy(copy.get(), bytes.data(), bytes.size());
  return copy.release();
}

}  // namespace

uint32_t HashItem::WriteKey(OutputStream& out, bool binary, const int* selector) const {
  return Write(out, binary, selector);
}

uint32_t HashItem::WriteValue(OutputStream& out, bool binary, const int* selector) const {
  return Write(out, binary, selector);
}

ByteRunKey::ByteRunKey(const uint8_t* bytes, uint32_t byteCount, bool copy)
    : ByteRunKey(bytes, byteCount, copy ? Storage::kAllocated : Storage::kBorrowed) {
  if (copy) data = CopyOf(Bytes());
}

ByteRunKey::ByteRunKey(const ByteRunKey& other) : ByteRunKey(other.data, other.length, true) {}

ByteRunKey::~ByteRunKey() {
  if (storage == Storage::kAllocated) delete[] data;
}

uint32_t ByteRunKey::Write(OutputStream& out, bool binary, const int*) const {
  if (length == 0) return 0;
  if (binary) return WriteBytes(out, data, length);
  std::vector<uint16_t> text;
  text.reserve(size_t{length} + 2);
  text.push_back('"');
  text.insert(text.end(), data, data + length);
  text.push_back('=');
  return WriteUnits(out, text);
}

// Looks at nine bytes at most: every one of a key of up to nine, then every second, and so on. Each
// is added to the hash so far, shifted left by five, modulo n; nine such steps need 49 bits, so
// that the remainder can be taken once, at the end.
uint32_t ByteRunKey::Hash(uint32_t n) const noexcept {
  const uint32_t step = std::max(length / 5, 1u);
  uint64_t hash = 0;
  for (uint64_t i = 0; i < length; i += step) hash = (hash << 5) + data[i];
  return static_cast<uint32_t>(hash % n);
}

// The bytes begin at an even place behind the key: they are code units.
KeyedRun* KeyedRun::Create(Arena& arena, std::span<const uint8_t> key,
                           std::span<const uint8_t> bytes) {
  const uint64_t offset = sizeof(KeyedRun) + (uint64_t{key.size()} + 1) / 2 * 2;
  if (offset > std::numeric_limits<uint32_t>::max()) throw std::bad_alloc();
  auto* const block = static_cast<uint8_t*>(arena.Allocate(offset + bytes.size()));
  std::copy(key.begin(), key.end(), block + sizeof(KeyedRun));
  std::copy(bytes.begin(), bytes.end(), block + offset);
  return ::new (block) KeyedRun(static_cast<uint32_t>(key.size()),
                                static_cast<uint32_t>(bytes.size()), static_cast<uint32_t>(offset));
}

DictionaryEntry::DictionaryEntry(KeyedRun& keyedRun) noexcept
    : ByteRunKey(keyedRun.Key().data(), static_cast<uint32_t>(keyedRun.Key().size()),
                 Storage::kWithValue),
      run(keyedRun),
      value(keyedRun) {
  run.entry = this;
}

std::unique_ptr<DictionaryEntry> DictionaryEntry::Create(EntryMemory& memory, const ByteRunKey& key,
                                                         std::span<const uint8_t> valueBytes) {
  KeyedRun& run = *KeyedRun::Create(memory.runs, key.Bytes(), valueBytes);
  const KolvaneString owner(run);
  void* const place = memory.entries.Allocate(sizeof(DictionaryEntry));
  return std::unique_ptr<DictionaryEntry>(::new (place) DictionaryEntry(run));
}

std::unique_ptr<DictionaryEntry> DictionaryEntry::Create(EntryMemory& memory, const ByteRunKey& key,
                                                         std::span<const uint16_t> text) {
  std::vector<uint16_t> decoded;
  const std::span<const uint16_t> units = Unescape(text, decoded);
  return Create(memory, key, {reinterpret_cast<const uint8_t*>(units.data()), units.size_bytes()});
}

std::unique_ptr<DictionaryEntry> DictionaryEntry::CopyIn(EntryMemory& memory) const {
  return Create(memory, *this,
                {reinterpret_cast<const uint8_t*>(value.Data()), size_t{value.ByteLength()}});
}

uint64_t DictionaryEntry::MemorySize() const noexcept {
  return sizeof(KeyedRun) + sizeof(DictionaryEntry) + uint64_t{Bytes().size()} + value.ByteLength();
}

uint32_t DictionaryEntry::SerializedSize() const {
  return ByteRunKey::SerializedSize() + 2 * value.Length();
}

uint32_t DictionaryEntry::Write(OutputStream& out, bool binary, const int* selector) const {
  const uint32_t keyBytes = WriteKey(out, binary, selector);
  return keyBytes + WriteValue(out, binary, selector);
}

uint32_t DictionaryEntry::WriteKey(OutputStream& out, bool binary, const int* selector) const {
  return ByteRunKey::Write(out, binary, selector);
}

uint32_t DictionaryEntry::WriteValue(OutputStream& out, bool binary, const int* selector) const {
  if (!binary) return WriteTextValue(out, value.Units());
  if (selector != nullptr) return WriteMultiByteValue(out, value, selector);
  return WriteBytes(out, value.Data(), value.ByteLength());
}

}  // namespace tovali_private
