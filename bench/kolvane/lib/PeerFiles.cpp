#include "bench/kolvane/lib/PeerFiles.h"

#include <unistd.h>

#include <cstdlib>
#include <fstream>
#include <stdexcept>

namespace {

constexpr char kHeader[] = "msgid \"\"\nmsgstr \"Content-Type: text/plain; charset=UTF-8\\n\"\n\n";

void FillCatalogue(std::ostream& stream, const KeySet& set) {
  stream << kHeader;
  for (size_t i = 0; i < set.Size(); ++i) {
    stream << "msgid " << InQuotes(set.keys[i]) << "\nmsgstr " << InQuotes(set.valuesInUTF8[i])
           << "\n\n";
  }
}

}  // namespace

std::filesystem::path CatalogueFile(const KeySet& set, const std::filesystem::path& folder) {
  const auto target = folder / "de/LC_MESSAGES/bench.mo";
  if (exists(target)) return target;
  const auto source = folder / "bench.po";
  WriteSource(source, [&](std::ostream& stream) { FillCatalogue(stream, set); });
  create_directories(target.parent_path());
  RunCompiler(MSGFMT " -o " + target.string() + " " + source.string());
  remove(source);
  return target;
}

void WriteSource(const std::filesystem::path& path,
                 const std::function<void(std::ostream&)>& fill) {
  std::ofstream stream(path, std::ios::binary);
  stream.exceptions(std::ios::failbit | std::ios::badbit);
  fill(stream);
}

std::string OneMoreName(const std::filesystem::path& file) {
  static int count = 0;
  const std::string name = "name-" + std::to_string(getpid()) + '-' + std::to_string(++count);
  create_hard_link(file, file.parent_path() / (name + file.extension().string()));
  return name;
}

void RunCompiler(const std::string& command) {
  if (std::system((command + " >/dev/null").c_str()) != 0) {
    throw std::runtime_error("this failed: " + command);
  }
}

std::string InQuotes(std::string_view text) {
  std::string quoted = "\"";
  for (const char byte : text) {
    if (byte == '"' || byte == '\\') quoted += '\\';
    quoted += byte;
  }
  return quoted + '"';
}
