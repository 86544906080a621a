// Conversion between UTF-16 and the multibyte text of a code page.
//
// There are two code pages: UTF-8, and the system's own, which is windows-1252 on systems other
// than Windows. On Windows these functions are the system's; elsewhere they are implemented here.
// Contract:
//
// * Requires: flags are 0, counts are positive (terminators are not searched for), the text is not
//   null.
// * A capacity of 0 returns the number of units (or bytes) that the whole text needs; the output
// may
//   be null.
// * Otherwise the text is converted into an output of `capacity` units (or bytes), without
//   terminator. Returns the number written.
// * Returns 0 on failure. GetLastError is then kErrorInsufficientBuffer if the output is too small
//   (its contents are undefined), or kErrorInvalidParameter if a requirement is violated or the
//   size does not fit an int.
//
// Ill-formed text never fails. In UTF-8 one U+FFFD replaces each of these:
//
// * a byte that cannot begin a sequence;
// * a lead byte with the bytes after it that could continue it (E2 82 in E2 82 41);
// * a lead byte with a second byte of 80 to BF that it forbids (E0 80, and ED A0 in ED A0 80).
//
// Every well-formed sequence is converted. An unpaired surrogate becomes EF BF BD in UTF-8. The
// bytes 81, 8D, 8F, 90 and 9D, which windows-1252 leaves undefined, become the C1 controls of the
// same value.
//
// Windows differs in two things:
//
// * A lead byte with too few bytes left in the text is replaced together with all of them, even if
//   they are well-formed: E9 74 is one U+FFFD there, and U+FFFD 't' elsewhere.
// * A unit that windows-1252 lacks becomes '?', but for some a look-alike, such as A for U+0100.
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

// Returns the reason of the calling thread's latest failure. Success does not change it.
uint32_t GetLastError() noexcept;

}  // namespace platform
