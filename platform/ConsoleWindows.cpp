#include <windows.h>
// shellapi.h needs windows.h.
#include <fcntl.h>
#include <io.h>
#include <shellapi.h>
#include <stdio.h>
#include <stdlib.h>

#include <memory>

#include "Console.h"
#include "WideText.h"

namespace platform {
namespace {

UINT gCodePageBefore = 0;

bool IsConsole(DWORD standardHandle) noexcept {
  DWORD mode = 0;
  return ::GetConsoleMode(::GetStdHandle(standardHandle), &mode) != 0;
}

}  // namespace

std::vector<std::string> Arguments(int, char**) {
  int count = 0;
  const std::unique_ptr<LPWSTR, decltype(&::LocalFree)> words(
      ::CommandLineToArgvW(::GetCommandLineW(), &count), &::LocalFree);
  std::vector<std::string> arguments;
  for (int i = 0; i < count; ++i) arguments.push_back(UTF8FromWide(words.get()[i]));
  return arguments;
}

bool StandardInputIsTerminal() noexcept {
  return IsConsole(STD_INPUT_HANDLE);
}

bool HitClosedPipe() noexcept {
  return _doserrno == ERROR_BROKEN_PIPE || _doserrno == ERROR_NO_DATA ||
         _doserrno == ERROR_PIPE_NOT_CONNECTED;
}

// The console's code page outlives the program.
void SpeakUTF8() noexcept {
  for (std::FILE* const stream : {stdin, stdout, stderr}) _setmode(_fileno(stream), _O_BINARY);
  if (!IsConsole(STD_OUTPUT_HANDLE) && !IsConsole(STD_ERROR_HANDLE)) return;
  gCodePageBefore = ::GetConsoleOutputCP();
  ::SetConsoleOutputCP(CP_UTF8);
  std::atexit([] { ::SetConsoleOutputCP(gCodePageBefore); });
}

}  // namespace platform
