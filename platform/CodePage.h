// Conversion between UTF-16 and the multibyte text of a code page.
//
// Two code pages exist: UTF-8, and the system's own, which off Windows is windows-1252. On Windows
// these functions are the system's; elsewhere a layer of ours keeps the same contract:
//
// * flags must be 0; counts are positive (a text's terminator is not looked for); the text is not
//   null.
// * capacity 0 asks for the size: the result is the number of units (or bytes) that the whole text
//   needs, and the output, which may be null, is left alone.
// * Otherwise the text is converted into the output, which holds `capacity` units (or bytes) and
//   gets no terminator; the result is the number written.
// * 0 means failure, and GetLastError tells why: kErrorInsufficientBuffer when the output is too
//   small (what it then holds is not defined), kErrorInvalidParameter when a rule above is broken
//   or the size does not fit an int.
//
// Damaged text never fails. In UTF-8 one U+FFFD stands for a byte that begins nothing; for a lead
// byte with the bytes after it, as far as they could continue it (E2 82 in E2 82 41), and with a
// second byte of 80 to BF that does not fit it (E0 80, ED A0; what follows is on its own); and for
// a lead byte with all that is left of the text, where that is too little for it. An unpaired
// surrogate becomes EF BF BD in UTF-8. The bytes 81, 8D, 8F, 90 and 9D of windows-1252, which it
// leaves undefined, stand for the C1 control of their value.
//
// One thing is the system's own: a unit that windows-1252 lacks becomes '?', but on Windows, for
// some, a look-alike, such as A for U+0100.
//
// Nothing here allocates or throws.
#pragma once

#include <cstdint>

namespace platform {

inline constexpr uint32_t kCodePageSystem = 0;
inline constexpr uint32_t kCodePageUTF8 = 65001;

inline constexpr uint32_t kErrorInvalidParameter = 87;
inline constexpr uint32_t kErrorInsufficientBuffer = 122;

int MultiByteToWideChar(uint32_t codePage, uint32_t flags, const char* text, int byteCount,
                        uint16_t* units, int capacity) noexcept;

int WideCharToMultiByte(uint32_t codePage, uint32_t flags, const uint16_t* units, int unitCount,
                        char* bytes, int capacity) noexcept;

// The reason of the calling thread's latest failure; a success leaves it as it was.
uint32_t GetLastError() noexcept;

}  // namespace platform
