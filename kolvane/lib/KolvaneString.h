// The text of a translation: immutable UTF-16 that many holders share.
#pragma once

#include <cstddef>
#include <cstdint>
#include <new>
#include <span>

namespace tovali_private {

// Counts its handles and destroys itself when the last one lets go. The count is a plain integer:
// handles that share an object stay on one thread at a time, and so do all that come from one
// dictionary, which share memory.
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

// A run of bytes, in one block of memory with the object.
class ByteRunValue : public RefCountObj {
 public:
  // Copies the bytes. Goes with the last handle to it, of which there is none yet. Throws
  // std::bad_alloc.
  static ByteRunValue* Create(const uint8_t* bytes, uint32_t byteCount);

  // Null when there are none.
  const uint8_t* Data() const noexcept { return length == 0 ? nullptr : Bytes(); }
  uint32_t Length() const noexcept { return length; }

  static void operator delete(void* block) noexcept { ::operator delete(block); }

 protected:
  // The bytes stand `offset` bytes behind the object's start.
  ByteRunValue(uint32_t byteCount, uint32_t offset) noexcept
      : length(byteCount), bytesOffset(offset) {}
  ~ByteRunValue() override = default;

  const uint8_t* Bytes() const noexcept {
    return reinterpret_cast<const uint8_t*>(this) + bytesOffset;
  }

 private:
  uint32_t length;
  uint32_t bytesOffset;
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
  explicit KolvaneString(tovali_private::ByteRunValue& bytes) noexcept : value(&bytes) {
    value->AddRef();
  }

  KolvaneString(const KolvaneString& other) noexcept : KolvaneString(*other.value) {}
  KolvaneString& operator=(const KolvaneString& other) noexcept;
  ~KolvaneString() { value->Release(); }

  const uint16_t* Data() const noexcept { return reinterpret_cast<const uint16_t*>(value->Data()); }
  uint32_t Length() const noexcept { return value->Length() / 2; }
  uint32_t ByteLength() const noexcept { return value->Length(); }
  std::span<const uint16_t> Units() const noexcept { return {Data(), Length()}; }

 private:
  static const KolvaneString& Empty();

  tovali_private::ByteRunValue* value;  // shared, never null
};
