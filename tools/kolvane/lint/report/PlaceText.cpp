#include "tools/kolvane/lint/report/PlaceText.h"

#include <fmt/format.h>

#include <algorithm>

#include "tools/kolvane/cli/Diagnostics.h"

std::string PlaceText(const Place& place) {
  const std::string file = Printable(place.file);
  if (place.line != 0) return fmt::format("{}:{}:{}", file, place.line, place.column);
  const std::string position = BinaryPosition(place);
  return position.empty() ? file : fmt::format("{}: {}", file, position);
}

std::string BinaryPosition(const Place& place) {
  std::string entry = place.entry == 0 ? "" : fmt::format("entry {}", place.entry);
  if (!place.hasOffset) return entry;
  return fmt::format("{}{}byte {}", entry, entry.empty() ? "" : ", ", place.offset);
}

std::string PortableName(const std::string& file) {
  std::string name = file;
  if (kHasDrives) std::ranges::replace(name, '\\', '/');
  while (name.starts_with("./") && name.size() > 2) name.erase(0, 2);
  return name;
}

std::string PercentEncoded(std::string_view text, bool (*isSpecial)(char)) {
  std::string encoded;
  for (const char character : text) {
    if (isSpecial(character)) {
      encoded += fmt::format("%{:02X}", static_cast<unsigned char>(character));
    } else {
      encoded += character;
    }
  }
  return encoded;
}
