#include <unistd.h>

#include "Console.h"

namespace platform {

bool StandardInputIsTerminal() noexcept {
  return isatty(STDIN_FILENO) != 0;
}

}  // namespace platform
