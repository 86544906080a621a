// The text of a translation: immutable UTF-16 that many holders share.
#pragma once

#include <cstddef>
#include <cstdint>
#include <new>
#include <span>

namespace tovali_private {

// Counts its handles and destroys itself when the last one lets go. The count is a plain integer:
// handles that share an object stay on one thread at a time.
class RefCountObj {
 public:
  RefCountObj(const RefCountObj&) = delete;
  RefCountObj& operator=(const RefCountObj&) = delete;

  void AddRef() noexcept { ++count; }
  void Release() noexcept {
    if (--count == 0) delete this;
  }

 protected:
  RefCountObj() = default;
  virtual ~RefCountObj() = default;

 private:
  uint32_t count = 0;
};

// A run of bytes, in one block of memory with the object. The block can have room for something else
// that is to live as long as the bytes.
class ByteRunValue final : public RefCountObj {
 public:
  // The bytes are to be written, then shared. Throws std::bad_alloc.
  static ByteRunValue* Create(uint64_t byteCount, size_t room = 0);

  // Gives up the bytes behind the first `byteCount`; to be done before the run is shared.
  void Shorten(uint32_t byteCount) noexcept { length = byteCount; }

  // Null when there are none.
  uint8_t* Data() noexcept { return length == 0 ? nullptr : Storage(); }
  uint32_t Length() const noexcept { return length; }

  // Aligned for pointers; to be asked for before the run is shortened.
  void* Room() noexcept { return Storage() + AlignedSize(length); }

  static void operator delete(void* block) noexcept { ::operator delete(block); }

 private:
  explicit ByteRunValue(uint32_t byteCount) noexcept : length(byteCount) {}
  ~ByteRunValue() override = default;

  uint8_t* Storage() noexcept { return reinterpret_cast<uint8_t*>(this + 1); }
  static uint64_t AlignedSize(uint64_t byteCount) noexcept;

  uint32_t length;
};

}  // namespace tovali_private

// A handle to a ByteRunValue whose bytes are UTF-16 code units in the machine's order, without a
// terminator; an odd last byte belongs to no unit. Copying shares the bytes. The data stays valid
// while any handle to it lives, and is null for an empty string.
class KolvaneString {
 public:
  // The process's one empty string.
  KolvaneString() : KolvaneString(Empty()) {}

  // Both copy what they are given, and throw std::bad_alloc also when it exceeds 2^32 - 1 bytes.
  KolvaneString(const uint16_t* units, uint32_t unitCount);
  KolvaneString(const uint8_t* bytes, uint32_t byteCount);

  // Shares the bytes.
  explicit KolvaneString(tovali_private::ByteRunValue* bytes) noexcept;

  KolvaneString(const KolvaneString& other) noexcept;
  KolvaneString& operator=(const KolvaneString& other) noexcept;
  ~KolvaneString();

  const uint16_t* Data() const noexcept { return reinterpret_cast<uint16_t*>(value->Data()); }
  uint32_t Length() const noexcept { return value->Length() / 2; }
  uint32_t ByteLength() const noexcept { return value->Length(); }
  std::span<const uint16_t> Units() const noexcept { return {Data(), Length()}; }

 private:
  static const KolvaneString& Empty();

  tovali_private::ByteRunValue* value;  // shared, never null
};
