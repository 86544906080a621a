// The byte streams that images are read from and that items are written to.
//
// They are not std::istream and std::ostream: constructing one of those, or calling it out of line,
// links every locale facet of the C++ runtime, which is larger than the whole plug-in where the
// runtime is linked statically.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

namespace tovali_private {

// A stream that can seek. It is at its end after a failure.
class InputStream {
 public:
  virtual ~InputStream() = default;

  // Unread bytes that are in memory; refills if there are none. Empty at the end, and for a stream
  // without a buffer, which only Read reads.
  virtual std::span<const uint8_t> Buffered() = 0;

  // Skips the first `count` of the bytes that Buffered returned last.
  virtual void Consume(size_t count) noexcept = 0;

  // Returns the number of bytes read, which is less than the span's size only at the end.
  virtual size_t Read(std::span<uint8_t> bytes) = 0;

  // Seeks to the start, unless a read has failed.
  virtual void Rewind() = 0;

  // Seeks to the end and returns the number of bytes skipped.
  virtual uint64_t SkipToEnd() = 0;

  // The number of bytes from the start to the end.
  virtual uint64_t Size() const noexcept = 0;

  // Whether reading ended for another reason than the end of the stream.
  virtual bool HasFailed() const noexcept = 0;
};

// Borrows the bytes and never fails.
class MemoryInput final : public InputStream {
 public:
  explicit MemoryInput(std::span<const uint8_t> input) noexcept : bytes(input), unread(input) {}
  explicit MemoryInput(std::string_view input) noexcept
      : MemoryInput({reinterpret_cast<const uint8_t*>(input.data()), input.size()}) {}

  std::span<const uint8_t> Buffered() override { return unread; }
  void Consume(size_t count) noexcept override { unread = unread.subspan(count); }

  size_t Read(std::span<uint8_t> place) override {
    const size_t count = std::min(place.size(), unread.size());
    std::copy_n(unread.begin(), count, place.begin());
    Consume(count);
    return count;
  }

  void Rewind() override { unread = bytes; }
  uint64_t SkipToEnd() override {
    const size_t count = unread.size();
    Consume(count);
    return count;
  }
  uint64_t Position() const noexcept { return bytes.size() - unread.size(); }
  uint64_t Size() const noexcept override { return bytes.size(); }
  bool HasFailed() const noexcept override { return false; }

 private:
  std::span<const uint8_t> bytes;
  std::span<const uint8_t> unread;
};

class OutputStream {
 public:
  virtual ~OutputStream() = default;
  virtual void Write(std::span<const uint8_t> bytes) = 0;
};

// Keeps what is written. Throws std::bad_alloc.
class MemoryOutput final : public OutputStream {
 public:
  void Write(std::span<const uint8_t> bytes) override {
    written.insert(written.end(), bytes.begin(), bytes.end());
  }

  std::span<const uint8_t> Bytes() const noexcept { return written; }
  void Clear() noexcept { written.clear(); }

 private:
  std::vector<uint8_t> written;
};

}  // namespace tovali_private
