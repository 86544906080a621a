#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>

#include "platform/Console.h"

namespace platform {

std::vector<std::string> Arguments(int count, char** words) {
  return {words, words + count};
}

bool StandardInputIsTerminal() noexcept {
  return isatty(STDIN_FILENO) != 0;
}

bool StandardOutputShowsColour() noexcept {
  const char* const kind = std::getenv("TERM");
  return isatty(STDOUT_FILENO) != 0 && kind != nullptr && std::strcmp(kind, "dumb") != 0;
}

bool HitClosedPipe() noexcept {
  return errno == EPIPE;
}

void SpeakUTF8() noexcept {}

}  // namespace platform
