// The key set of real translations: the German ones of Debian's iso-codes, with keys made from the
// messages.
#include <fmt/format.h>

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>

#include "bench/kolvane/lib/KeySet.h"

namespace {

namespace fs = std::filesystem;

constexpr char kFolder[] = "/usr/share/locale/de/LC_MESSAGES";

std::string ReadFile(const fs::path& path) {
  std::ifstream stream(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(stream), {}};
}

uint32_t ReadWord(const std::string& catalogue, size_t offset) {
  uint32_t word = 0;
  std::memcpy(&word, catalogue.data() + offset, sizeof word);
  return word;
}

// Returns the text that row `row` of the table at `table` points to.
std::string_view ReadText(const std::string& catalogue, size_t table, size_t row) {
  const uint32_t length = ReadWord(catalogue, table + 8 * row);
  return std::string_view(catalogue).substr(ReadWord(catalogue, table + 8 * row + 4), length);
}

// The bytes that every library allows in a key.
bool StaysInKey(char byte) {
  constexpr std::string_view kPunctuation = " '(),-./:;_";
  const bool isLetter = (byte >= 'a' && byte <= 'z') || (byte >= 'A' && byte <= 'Z');
  return isLetter || (byte >= '0' && byte <= '9') ||
         kPunctuation.find(byte) != std::string_view::npos;
}

std::string MakeKey(const std::string& domain, std::string_view message) {
  std::string key = '/' + domain + '/';
  for (const char byte : message) {
    if (StaysInKey(byte)) {
      key += byte;
    } else {
      key += fmt::format("%{:02X}", static_cast<unsigned char>(byte));
    }
  }
  return key;
}

void AddCatalogue(KeySet& set, const fs::path& path) {
  const std::string catalogue = ReadFile(path);
  constexpr uint32_t kMagic = 0x950412DE;
  if (catalogue.size() < 20 || ReadWord(catalogue, 0) != kMagic) {
    throw std::runtime_error("not a catalogue: " + path.string());
  }
  const uint32_t count = ReadWord(catalogue, 8);
  for (size_t row = 0; row < count; ++row) {
    const std::string_view message = ReadText(catalogue, ReadWord(catalogue, 12), row);
    if (message.empty()) continue;  // the catalogue's header
    AddEntry(set, MakeKey(path.stem(), message), ReadText(catalogue, ReadWord(catalogue, 16), row));
  }
}

}  // namespace

void AddIsoCodes(KeySet& set) {
  std::vector<fs::path> paths;
  std::error_code missing;
  for (const auto& file : fs::directory_iterator(kFolder, missing)) {
    const bool isOldName = file.is_symlink();
    if (!isOldName && file.path().filename().string().starts_with("iso_")) {
      paths.push_back(file.path());
    }
  }
  std::sort(paths.begin(), paths.end());
  for (const auto& path : paths) AddCatalogue(set, path);
}
