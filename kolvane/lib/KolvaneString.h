// The text of a translation: immutable UTF-16 that many holders share.
#pragma once

#include <cstdint>
#include <memory>
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

// A copy of the bytes it is given; the bytes are null when there are none.
class ByteRunValue final : public RefCountObj {
 public:
  ByteRunValue(const uint8_t* bytes, uint32_t byteCount);

  const uint8_t* Data() const noexcept { return data.get(); }
  uint32_t Length() const noexcept { return length; }

 private:
  ~ByteRunValue() override = default;

  uint32_t length;
  std::unique_ptr<uint8_t[]> data;
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

  KolvaneString(const KolvaneString& other) noexcept;
  KolvaneString& operator=(const KolvaneString& other) noexcept;
  ~KolvaneString();

  const uint16_t* Data() const noexcept { return reinterpret_cast<const uint16_t*>(value->Data()); }
  uint32_t Length() const noexcept { return value->Length() / 2; }
  uint32_t ByteLength() const noexcept { return value->Length(); }
  std::span<const uint16_t> Units() const noexcept { return {Data(), Length()}; }

 private:
  static const KolvaneString& Empty();

  tovali_private::ByteRunValue* value;  // shared, never null
};
