#include "StreamSize.h"

#include <istream>
#include <limits>

namespace tovali_private {
namespace {

// A failure other than badbit is that of a seek or a read that only asked for the size.
void Rewind(std::istream& stream) {
  stream.clear(stream.rdstate() & std::ios::badbit);
  stream.seekg(0);
}

}  // namespace

uint64_t SkipToEnd(std::istream& stream) {
  stream.ignore(std::numeric_limits<std::streamsize>::max());
  return static_cast<uint64_t>(stream.gcount());
}

uint64_t StreamSize(std::istream& stream) {
  stream.seekg(0, std::ios::end);
  const std::streamoff end = stream.tellg();
  Rewind(stream);
  if (end >= 0) return static_cast<uint64_t>(end);
  const uint64_t size = SkipToEnd(stream);
  Rewind(stream);
  return size;
}

}  // namespace tovali_private
