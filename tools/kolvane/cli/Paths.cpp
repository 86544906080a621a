#include "tools/kolvane/cli/Paths.h"

#include <system_error>

namespace fs = std::filesystem;

fs::path PathOf(const std::string& name) {
  return {std::u8string(name.begin(), name.end())};
}

std::string NameOf(const fs::path& path) {
  const std::u8string name = path.u8string();
  return {name.begin(), name.end()};
}

bool AreSameFile(const std::string& one, const std::string& other) {
  if (one == "-" || other == "-") return false;
  std::error_code error;
  return fs::is_regular_file(PathOf(one), error) &&
         fs::equivalent(PathOf(one), PathOf(other), error);
}
