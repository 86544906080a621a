#include <io.h>
#include <stdio.h>

#include "Console.h"

namespace platform {

bool StandardInputIsTerminal() noexcept {
  return _isatty(_fileno(stdin)) != 0;
}

}  // namespace platform
