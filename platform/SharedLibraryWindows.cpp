#include <windows.h>

#include "platform/SharedLibrary.h"
#include "platform/WideText.h"

namespace platform {
namespace {

// Suppresses the system's error dialogs for libraries that cannot be loaded.
class QuietErrors {
 public:
  QuietErrors() { ::SetThreadErrorMode(SEM_FAILCRITICALERRORS, &before); }
  ~QuietErrors() { ::SetThreadErrorMode(before, nullptr); }
  QuietErrors(const QuietErrors&) = delete;
  QuietErrors& operator=(const QuietErrors&) = delete;

 private:
  DWORD before = 0;
};

// Appends a dot to a name without extension, so that the system appends none.
std::wstring ExactName(const char* path) {
  std::wstring name = WideFromUTF8(path);
  const size_t last = name.find_last_of(L"/\\") + 1;
  if (name.find(L'.', last) == std::wstring::npos) name += L'.';
  return name;
}

std::string ErrorText(DWORD error) {
  wchar_t text[512];
  constexpr DWORD kFlags =
      FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS | FORMAT_MESSAGE_MAX_WIDTH_MASK;
  DWORD length = ::FormatMessageW(kFlags, nullptr, error, 0, text, ARRAYSIZE(text), nullptr);
  while (length > 0 && (text[length - 1] == L' ' || text[length - 1] == L'.')) --length;
  return length > 0 ? UTF8FromWide({text, length}) : "error " + std::to_string(error);
}

}  // namespace

SharedLibrary LoadSharedLibrary(const char* path, std::string& reason) {
  const std::wstring name = ExactName(path);
  const QuietErrors quiet;
  const HMODULE library = ::LoadLibraryW(name.c_str());
  if (library == nullptr) reason = std::string(path) + ": " + ErrorText(::GetLastError());
  return library;
}

void UnloadSharedLibrary(SharedLibrary library) noexcept {
  ::FreeLibrary(static_cast<HMODULE>(library));
}

void* FindFunction(SharedLibrary library, const char* name) noexcept {
  return reinterpret_cast<void*>(::GetProcAddress(static_cast<HMODULE>(library), name));
}

// A module's handle is the address of its headers.
AddressRange AddressesOf(SharedLibrary library) noexcept {
  const auto begin = reinterpret_cast<uintptr_t>(library);
  const auto* const dosHeader = reinterpret_cast<const IMAGE_DOS_HEADER*>(begin);
  const auto headers = begin + static_cast<uintptr_t>(dosHeader->e_lfanew);
  const auto* const header = reinterpret_cast<const IMAGE_NT_HEADERS*>(headers);
  return {begin, begin + header->OptionalHeader.SizeOfImage};
}

}  // namespace platform
