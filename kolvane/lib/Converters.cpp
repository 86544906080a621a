#include "kolvane/lib/Converters.h"

#include <limits>

#include "kolvane/lib/OVErrException.h"
#include "platform/CodePage.h"

namespace tovali_private {
namespace {

uint32_t PlatformFailure() noexcept {
  const bool isShort = platform::GetLastError() == platform::kErrorInsufficientBuffer;
  return isShort ? kErrorBufferTooSmall : kErrorConversionFailed;
}

int CheckedCount(size_t count) {
  if (count > std::numeric_limits<int>::max()) throw OVErrException(kErrorConversionFailed);
  return static_cast<int>(count);
}

void ThrowUnlessZero(uint32_t code) {
  if (code != 0) throw OVErrException(code);
}

}  // namespace

ConverterTable gConverterTable = {MultiByteToUnicodeLength, MultiByteToUnicode,
                                  UnicodeToMultiByteLength, UnicodeToMultiByte};

uint32_t CodePageFor(const int* selector) noexcept {
  const bool isUTF8 = selector != nullptr && *selector == kUTF8Selector;
  return isUTF8 ? platform::kCodePageUTF8 : platform::kCodePageSystem;
}

uint32_t MultiByteToUnicodeLength(const char* text, int byteCount, int* unitCount,
                                  const int* selector) noexcept {
  *unitCount = platform::MultiByteToWideChar(CodePageFor(selector), 0, text, byteCount, nullptr, 0);
  return 0;
}

uint32_t MultiByteToUnicode(const char* text, int byteCount, uint16_t* units, int unitCapacity,
                            const int* selector) noexcept {
  const int written =
      platform::MultiByteToWideChar(CodePageFor(selector), 0, text, byteCount, units, unitCapacity);
  return written != 0 || byteCount == 0 ? 0 : PlatformFailure();
}

uint32_t UnicodeToMultiByteLength(const uint16_t* units, int unitCount, int* byteCount,
                                  const int* selector) noexcept {
  const int needed =
      platform::WideCharToMultiByte(CodePageFor(selector), 0, units, unitCount, nullptr, 0);
  // INT_MAX bytes leave no room for the terminator in an int.
  *byteCount = needed < std::numeric_limits<int>::max() ? needed + 1 : 1;
  return 0;
}

uint32_t UnicodeToMultiByte(const uint16_t* units, int unitCount, char* bytes, int byteCapacity,
                            int* bytesWritten, const int* selector) noexcept {
  *bytesWritten = platform::WideCharToMultiByte(CodePageFor(selector), 0, units, unitCount, bytes,
                                                byteCapacity);
  return *bytesWritten != 0 || unitCount == 0 ? 0 : PlatformFailure();
}

int CountUnicode(const char* text, size_t byteCount, const int* selector) {
  int unitCount = 0;
  ThrowUnlessZero(gConverterTable.multiByteToUnicodeLength(text, CheckedCount(byteCount),
                                                           &unitCount, selector));
  return unitCount;
}

void ConvertToUnicode(const char* text, size_t byteCount, UnicodeBuffer& units,
                      const int* selector) {
  const int unitCount = CountUnicode(text, byteCount, selector);
  units.Clear();
  units.Reserve(static_cast<size_t>(unitCount));
  const uint32_t code = gConverterTable.multiByteToUnicode(text, CheckedCount(byteCount),
                                                           units.Data(), unitCount, selector);
  units.SetLength(static_cast<uint32_t>(unitCount));
  ThrowUnlessZero(code);
}

int CountMultiByte(const uint16_t* units, size_t unitCount, const int* selector) {
  int byteCount = 0;
  ThrowUnlessZero(gConverterTable.unicodeToMultiByteLength(units, CheckedCount(unitCount),
                                                           &byteCount, selector));
  return byteCount;
}

void ConvertToMultiByte(const uint16_t* units, size_t unitCount, char* bytes, int size,
                        const int* selector) {
  if (bytes == nullptr || size < 1) throw OVErrException(kErrorBufferTooSmall);
  int written = 0;
  ThrowUnlessZero(gConverterTable.unicodeToMultiByte(units, CheckedCount(unitCount), bytes,
                                                     size - 1, &written, selector));
  // A capacity of 0 made the converter count instead of write.
  if (written > size - 1) throw OVErrException(kErrorBufferTooSmall);
  bytes[written] = 0;
}

}  // namespace tovali_private
