#include <windows.h>
// shellapi.h needs windows.h.
#include <fcntl.h>
#include <io.h>
#include <shellapi.h>
#include <stdio.h>
#include <stdlib.h>

#include <memory>
#include <string_view>

#include "platform/Console.h"
#include "platform/WideText.h"

namespace platform {
namespace {

UINT gCodePageBefore = 0;
DWORD gConsoleModeBefore = 0;

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

// The console's mode outlives the program.
bool StandardOutputShowsColour() noexcept {
  constexpr DWORD kEscapes = 0x0004;  // ENABLE_VIRTUAL_TERMINAL_PROCESSING, since Windows 10
  const HANDLE output = ::GetStdHandle(STD_OUTPUT_HANDLE);
  if (::GetConsoleMode(output, &gConsoleModeBefore) == 0) return false;
  const char* const kind = std::getenv("TERM");
  if (kind != nullptr && std::string_view(kind) == "dumb") return false;
  if ((gConsoleModeBefore & kEscapes) != 0) return true;
  if (::SetConsoleMode(output, gConsoleModeBefore | kEscapes) == 0) return false;
  std::atexit([] { ::SetConsoleMode(::GetStdHandle(STD_OUTPUT_HANDLE), gConsoleModeBefore); });
  return true;
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
