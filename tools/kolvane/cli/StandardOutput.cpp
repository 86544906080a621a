#include "tools/kolvane/cli/StandardOutput.h"

#include <fmt/format.h>

#include <cerrno>
#include <cstdio>
#include <cstring>

#include "platform/Console.h"
#include "tools/kolvane/cli/Diagnostics.h"

namespace {

bool gFailed = false;

void Require(bool written) {
  if (written) return;
  gFailed = true;
  if (platform::HitClosedPipe()) throw ClosedPipe();
  throw Failure(fmt::format("cannot write to standard output: {}", std::strerror(errno)));
}

}  // namespace

void WriteOutput(std::string_view text) {
  Require(std::fwrite(text.data(), 1, text.size(), stdout) == text.size());
}

void FlushOutput() {
  Require(std::fflush(stdout) == 0);
}

void CloseOutput() {
  const bool closed = std::fclose(stdout) == 0;
  Require(closed || gFailed);
}
