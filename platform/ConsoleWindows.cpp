#include <windows.h>
// Needs what stands above.
#include <fcntl.h>
#include <io.h>
#include <shellapi.h>
#include <stdio.h>
#include <stdlib.h>

#include <memory>

#include "Console.h"
#include "WideText.h"

namespace platform {

std::vector<std::string> Arguments(int, char**) {
  int count = 0;
  const std::unique_ptr<LPWSTR, decltype(&::LocalFree)> words(
      ::CommandLineToArgvW(::GetCommandLineW(), &count), &::LocalFree);
  std::vector<std::string> arguments;
  for (int i = 0; i < count; ++i) arguments.push_back(UTF8FromWide(words.get()[i]));
  return arguments;
}

bool StandardInputIsTerminal() noexcept {
  return _isatty(_fileno(stdin)) != 0;
}

bool HitClosedPipe() noexcept {
  return _doserrno == ERROR_BROKEN_PIPE || _doserrno == ERROR_NO_DATA ||
         _doserrno == ERROR_PIPE_NOT_CONNECTED;
}

void UseBinaryStreams() noexcept {
  for (std::FILE* const stream : {stdin, stdout, stderr}) _setmode(_fileno(stream), _O_BINARY);
}

}  // namespace platform
