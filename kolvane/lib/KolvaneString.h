// Immutable, reference-counted UTF-16 text.
#pragma once

#include <cstddef>
#include <cstdint>
#include <new>
#include <span>

namespace tovali_private {

// An intrusive reference count; the initial count is 0, and the last Release deletes the object.
// The count is a plain integer: objects of one dictionary, which also share memory, are used on one
// thread at a time.
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

// Bytes, stored in one block of memory with the object.
class ByteRunValue : public RefCountObj {
 public:
  // Copies the bytes. The initial reference count is 0. Throws: std::bad_alloc.
  static ByteRunValue* Create(const uint8_t* bytes, uint32_t byteCount);

  // Null if there are none.
  const uint8_t* Data() const noexcept { return length == 0 ? nullptr : Bytes(); }
  uint32_t Length() const noexcept { return length; }

  static void operator delete(void* block) noexcept { ::operator delete(block); }

 protected:
  // The bytes begin `offset` bytes after the object's start.
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

// Shares ownership of UTF-16 code units in the machine's byte order, without terminator. Copying
// shares the units. Data is valid while any copy exists, and null for an empty string. An odd last
// byte is not part of the text.
class KolvaneString {
 public:
  // The process-wide empty string.
  KolvaneString() : KolvaneString(Empty()) {}

  // Copy their input. Throws: std::bad_alloc, also for more than 2^32 - 1 bytes.
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
