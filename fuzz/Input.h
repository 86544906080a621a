// What the targets share: an input in pieces, and the end where an answer is wrong.
#pragma once

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>
#include <vector>

// The engine, or Replay.cpp, calls it with bytes that it keeps; every target defines it. Returns 0.
extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size);

// Where a target takes several texts, it stands between them; what has none is one piece.
inline const std::string kSeparator = "<|>";

inline std::vector<std::string> Pieces(const uint8_t* data, size_t size) {
  std::string_view rest(reinterpret_cast<const char*>(data), size);
  std::vector<std::string> pieces;
  for (;;) {
    const size_t end = rest.find(kSeparator);
    pieces.emplace_back(rest.substr(0, end));
    if (end == rest.npos) return pieces;
    rest.remove_prefix(end + kSeparator.size());
  }
}

// The units that bytes hold in little-endian order; an odd last byte belongs to none.
inline std::u16string UnitsFrom(std::string_view bytes) {
  std::u16string units;
  for (size_t i = 0; i + 1 < bytes.size(); i += 2) {
    const auto low = static_cast<unsigned char>(bytes[i]);
    units += static_cast<char16_t>(low | static_cast<unsigned char>(bytes[i + 1]) << 8);
  }
  return units;
}

// The unit of the same value for each byte.
inline std::u16string Widened(std::string_view bytes) {
  std::u16string units;
  for (const char byte : bytes) units += static_cast<unsigned char>(byte);
  return units;
}

// Ends the process, which is a find, where `holds` is false.
inline void Require(bool holds, const char* what) {
  if (holds) return;
  std::fprintf(stderr, "not so: %s\n", what);
  std::abort();
}
