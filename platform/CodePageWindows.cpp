// Forwards to the system's conversion.
#include <windows.h>

#include "platform/CodePage.h"

namespace platform {

static_assert(kCodePageSystem == CP_ACP && kCodePageUTF8 == CP_UTF8);
static_assert(kErrorInvalidParameter == ERROR_INVALID_PARAMETER);
static_assert(kErrorInsufficientBuffer == ERROR_INSUFFICIENT_BUFFER);
static_assert(sizeof(wchar_t) == sizeof(uint16_t));

int MultiByteToWideChar(uint32_t codePage, uint32_t flags, const char* text, int byteCount,
                        uint16_t* units, int capacity) noexcept {
  return ::MultiByteToWideChar(codePage, flags, text, byteCount, reinterpret_cast<wchar_t*>(units),
                               capacity);
}

int WideCharToMultiByte(uint32_t codePage, uint32_t flags, const uint16_t* units, int unitCount,
                        char* bytes, int capacity) noexcept {
  return ::WideCharToMultiByte(codePage, flags, reinterpret_cast<const wchar_t*>(units), unitCount,
                               bytes, capacity, nullptr, nullptr);
}

uint32_t GetLastError() noexcept {
  return ::GetLastError();
}

}  // namespace platform
