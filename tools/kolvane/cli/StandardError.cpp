#include <fmt/format.h>

#include <cstdio>

#include "tools/kolvane/cli/Diagnostics.h"

void Say(std::string_view message) {
  const std::string line = fmt::format("kolvane: {}\n", message);
  static_cast<void>(std::fwrite(line.data(), 1, line.size(), stderr));
}
