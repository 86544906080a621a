#include "tools/kolvane/lint/report/Snippet.h"

#include <algorithm>
#include <string_view>
#include <vector>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/text/DisplayWidth.h"

namespace {

// What is shown at most on each side of the place, in columns.
constexpr int kMostColumns = 100;
constexpr int kMostTabColumns = 8;
constexpr size_t kMostBytes = 4;

bool ContinuesCharacter(char byte) noexcept {
  return (static_cast<unsigned char>(byte) & 0xC0) == 0x80;
}

std::vector<std::string_view> Characters(std::string_view line) {
  std::vector<std::string_view> characters;
  while (!line.empty()) {
    size_t size = 1;
    while (size < std::min(line.size(), kMostBytes) && ContinuesCharacter(line[size])) ++size;
    characters.push_back(line.substr(0, size));
    line.remove_prefix(size);
  }
  return characters;
}

char32_t Decoded(std::string_view character) noexcept {
  constexpr unsigned char kLeadBits[kMostBytes + 1] = {0, 0x7F, 0x1F, 0x0F, 0x07};
  char32_t value = static_cast<unsigned char>(character.front()) & kLeadBits[character.size()];
  for (const char byte : character.substr(1)) {
    value = value << 6 | (static_cast<unsigned char>(byte) & 0x3F);
  }
  return value;
}

std::string Shown(std::string_view character) {
  return character == "\t" ? "\t" : Printable(character);
}

int Columns(std::string_view character) {
  if (character == "\t") return kMostTabColumns;
  const std::string shown = Shown(character);
  return shown == character ? DisplayWidth(Decoded(character)) : static_cast<int>(shown.size());
}

std::string Blank(std::string_view character) {
  if (character == "\t") return "\t";
  return std::string(static_cast<size_t>(Columns(character)), ' ');
}

// How many of the characters fit, from the first on.
template <class Iterator>
size_t CountFitting(Iterator first, Iterator last) {
  size_t count = 0;
  for (int columns = 0; first != last; ++first, ++count) {
    columns += Columns(*first);
    if (columns > kMostColumns) break;
  }
  return count;
}

}  // namespace

Snippet SnippetOf(const Place& place) {
  constexpr std::string_view kCut = "...";
  const std::vector<std::string_view> characters = Characters(place.lineText);
  const size_t at = std::min(place.column - 1, characters.size());
  const auto middle = characters.begin() + static_cast<std::ptrdiff_t>(at);
  const size_t first = at - CountFitting(std::make_reverse_iterator(middle), characters.rend());
  const size_t last = at + CountFitting(middle, characters.end());

  Snippet snippet;
  if (first > 0) snippet = {std::string(kCut), std::string(kCut.size(), ' ')};
  for (size_t i = first; i < last; ++i) snippet.line += Shown(characters[i]);
  for (size_t i = first; i < at; ++i) snippet.indent += Blank(characters[i]);
  if (last < characters.size()) snippet.line += kCut;
  return snippet;
}
