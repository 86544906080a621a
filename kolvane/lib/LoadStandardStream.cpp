// Loads from std::istream. A file of its own, so that programs that load from memory alone do not
// link the standard streams (see ByteStreams.h).
#include <algorithm>
#include <istream>
#include <limits>
#include <streambuf>

#include "kolvane/lib/ByteStreams.h"
#include "kolvane/lib/DictionaryTable.h"
#include "kolvane/lib/KolvaneDictionary.h"

namespace {

// Makes the get area of a std::streambuf accessible, which is protected.
struct GetArea : std::streambuf {
  static std::span<const uint8_t> Of(const std::streambuf& buffer) noexcept {
    const char* const next = (buffer.*&GetArea::gptr)();
    const char* const end = (buffer.*&GetArea::egptr)();
    return {reinterpret_cast<const uint8_t*>(next), static_cast<size_t>(end - next)};
  }

  static void Skip(std::streambuf& buffer, int count) noexcept { (buffer.*&GetArea::gbump)(count); }
};

// Borrows the stream. One that has failed before has no bytes.
class StandardInput final : public tovali_private::InputStream {
 public:
  explicit StandardInput(std::istream& input) : stream(input), isReadable(input.good()) {
    if (!isReadable) return;
    stream.seekg(0, std::ios::end);
    const std::streamoff end = stream.tellg();
    Rewind();
    size = end >= 0 ? static_cast<uint64_t>(end) : SkipToEnd();  // it may seek to positions only
    Rewind();
  }

  std::span<const uint8_t> Buffered() override {
    if (!stream.good()) return {};
    const auto buffered = GetArea::Of(*stream.rdbuf());
    if (!buffered.empty()) return buffered;
    stream.peek();
    return stream.good() ? GetArea::Of(*stream.rdbuf()) : buffered;
  }

  void Consume(size_t count) noexcept override {
    constexpr size_t kMost = std::numeric_limits<int>::max();
    while (count != 0) {
      const size_t step = std::min(count, kMost);
      GetArea::Skip(*stream.rdbuf(), static_cast<int>(step));
      count -= step;
    }
  }

  size_t Read(std::span<uint8_t> bytes) override {
    stream.read(reinterpret_cast<char*>(bytes.data()), static_cast<std::streamsize>(bytes.size()));
    return static_cast<size_t>(stream.gcount());
  }

  void Rewind() override {
    if (!isReadable) return;
    stream.clear(stream.rdstate() & std::ios::badbit);  // a short read, or a seek that failed
    stream.seekg(0);
  }

  uint64_t SkipToEnd() override {
    if (!stream.good()) return 0;
    stream.ignore(std::numeric_limits<std::streamsize>::max());
    return static_cast<uint64_t>(stream.gcount());
  }

  uint64_t Size() const noexcept override { return size; }

  bool HasFailed() const noexcept override {
    return isReadable && (stream.bad() || (stream.fail() && !stream.eof()));
  }

 private:
  std::istream& stream;
  bool isReadable;
  uint64_t size = 0;
};

}  // namespace

void DictionaryTable::Load(std::istream& image) {
  StandardInput input(image);
  Load(input);
}

void KolvaneDictionary::Load(std::istream& image) {
  table->Load(image);
}
