#include "Messages.h"

#include <fmt/format.h>

#include <cstdio>

void Say(std::string_view message) {
  fmt::print(stderr, "kolvane: {}\n", message);
}

std::string Printable(std::string_view text) {
  std::string printable;
  for (const char character : text) {
    const auto byte = static_cast<unsigned char>(character);
    if (byte < 0x20 || byte == 0x7F) {
      printable += fmt::format("\\x{:02X}", byte);
    } else {
      printable += character;
    }
  }
  return printable;
}
