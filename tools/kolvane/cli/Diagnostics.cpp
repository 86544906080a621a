#include "tools/kolvane/cli/Diagnostics.h"

#include <fmt/format.h>

#include <algorithm>

namespace {

bool IsControl(unsigned char byte) {
  return byte < 0x20 || byte == 0x7F;
}

// The controls from U+0080 to U+009F take two bytes.
bool IsControlPair(unsigned char first, unsigned char second) {
  return first == 0xC2 && second >= 0x80 && second < 0xA0;
}

}  // namespace

std::string Printable(std::string_view text) {
  std::string printable;
  const auto byteAt = [text](size_t at) -> unsigned char {
    return at < text.size() ? static_cast<unsigned char>(text[at]) : '\0';
  };
  for (size_t at = 0; at < text.size(); ++at) {
    if (IsControlPair(byteAt(at), byteAt(at + 1))) {
      printable += fmt::format("\\x{:02X}\\x{:02X}", byteAt(at), byteAt(at + 1));
      ++at;
    } else if (IsControl(byteAt(at))) {
      printable += fmt::format("\\x{:02X}", byteAt(at));
    } else {
      printable += text[at];
    }
  }
  return printable;
}

std::string Excerpt(std::string_view text) {
  constexpr size_t kMost = 60;
  const auto isInside = [](char byte) { return (static_cast<unsigned char>(byte) & 0xC0) == 0x80; };
  size_t size = std::min(text.size(), kMost);
  while (size > 0 && size < text.size() && isInside(text[size])) --size;
  return Printable(text.substr(0, size)) + (size < text.size() ? "..." : "");
}
