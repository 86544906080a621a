// Code-page conversion for systems without functions of their own. One pass over the text: runs of
// ASCII go to a sink unchanged, every other character through a codec. One sink counts, the other
// writes.
#include <array>
#include <cstddef>
#include <cstring>
#include <limits>
#include <type_traits>

#include "platform/CodePage.h"
#include "platform/Unicode.h"

namespace platform {
namespace {

thread_local uint32_t gLastError = 0;

// A sink takes all of its input and returns true, or nothing and returns false.
struct Counter {
  template <class In>
  bool Put(const In*, size_t count) noexcept {
    total += count;
    return true;
  }

  // Puts the unit of each byte.
  template <class Units>
  bool PutAll(const char*, size_t count, const Units&) noexcept {
    total += count;
    return true;
  }

  uint64_t total = 0;
};

template <class Out>
struct Writer {
  template <class In>
  bool Put(const In* from, size_t count) noexcept {
    if (count > capacity - total) return false;
    for (size_t i = 0; i < count; ++i) out[total + i] = static_cast<Out>(from[i]);
    total += count;
    return true;
  }

  template <class Units>
  bool PutAll(const char* bytes, size_t count, const Units& units) noexcept {
    if (count > capacity - total) return false;
    for (size_t i = 0; i < count; ++i) out[total + i] = units[static_cast<uint8_t>(bytes[i])];
    total += count;
    return true;
  }

  Out* out;
  size_t capacity;
  size_t total = 0;
};

template <class Unit>
constexpr bool IsASCII(Unit unit) noexcept {
  return static_cast<std::make_unsigned_t<Unit>>(unit) < 0x80;
}

// Returns the number of leading ASCII units. Tests eight bytes at a time.
template <class Unit>
size_t ASCIIRun(const Unit* text, size_t count) noexcept {
  constexpr uint64_t kBeyondASCII = sizeof(Unit) == 1 ? 0x8080808080808080 : 0xFF80FF80FF80FF80;
  constexpr size_t kStep = sizeof(uint64_t) / sizeof(Unit);
  size_t run = 0;
  for (; count - run >= kStep; run += kStep) {
    uint64_t block;
    std::memcpy(&block, text + run, sizeof block);
    if ((block & kBeyondASCII) != 0) break;
  }
  while (run < count && IsASCII(text[run])) ++run;
  return run;
}

// A codec converts the non-ASCII character at the start of a text and returns the number of units
// consumed, or 0 if the sink is full.
template <class Unit, class Sink, class Codec>
bool Walk(const Unit* text, size_t count, Sink& sink, Codec codec) noexcept {
  for (size_t at = 0; at < count;) {
    const size_t run = ASCIIRun(text + at, count - at);
    if (!sink.Put(text + at, run)) return false;
    at += run;
    if (at == count) break;
    const size_t taken = codec(text + at, count - at, sink);
    if (taken == 0) return false;
    at += taken;
  }
  return true;
}

// UTF-8 to UTF-16.

// How many bytes follow a lead byte, and what the first of them may be; the others are 80 to BF.
struct Lead {
  uint8_t following;
  uint8_t low;
  uint8_t high;
};

constexpr Lead LeadFor(uint8_t byte) noexcept {
  if (byte < 0xC2 || byte > 0xF4) return {0, 0, 0};
  if (byte < 0xE0) return {1, 0x80, 0xBF};
  if (byte == 0xE0) return {2, 0xA0, 0xBF};
  if (byte == 0xED) return {2, 0x80, 0x9F};
  if (byte < 0xF0) return {2, 0x80, 0xBF};
  if (byte == 0xF0) return {3, 0x90, 0xBF};
  if (byte == 0xF4) return {3, 0x80, 0x8F};
  return {3, 0x80, 0xBF};
}

constexpr bool Continues(uint8_t byte) noexcept {
  return byte >= 0x80 && byte < 0xC0;
}

// A well-formed sequence, or the bytes that one replacement character stands for: the longest start
// of a sequence, plus a second byte of 80 to BF that the lead byte forbids.
struct Sequence {
  char32_t character;
  size_t length;
};

Sequence ReadSequence(const char* text, size_t left) noexcept {
  const auto first = static_cast<uint8_t>(text[0]);
  const Lead lead = LeadFor(first);
  if (lead.following == 0) return {kReplacementCharacter, 1};
  char32_t character = first & (0x3Fu >> lead.following);
  for (size_t i = 1; i <= lead.following; ++i) {
    if (i == left) return {kReplacementCharacter, i};
    const auto byte = static_cast<uint8_t>(text[i]);
    if (!Continues(byte)) return {kReplacementCharacter, i};
    if (i == 1 && (byte < lead.low || byte > lead.high)) return {kReplacementCharacter, 2};
    character = (character << 6) | (byte & 0x3Fu);
  }
  return {character, size_t{lead.following} + 1};
}

template <class Sink>
bool PutUTF16(char32_t character, Sink& sink) noexcept {
  if (character < 0x10000) {
    const auto unit = static_cast<uint16_t>(character);
    return sink.Put(&unit, 1);
  }
  const char32_t offset = character - 0x10000;
  const uint16_t pair[] = {static_cast<uint16_t>(0xD800 + (offset >> 10)),
                           static_cast<uint16_t>(0xDC00 + (offset & 0x3FF))};
  return sink.Put(pair, 2);
}

constexpr auto kFromUTF8 = [](const char* text, size_t left, auto& sink) -> size_t {
  const Sequence sequence = ReadSequence(text, left);
  return PutUTF16(sequence.character, sink) ? sequence.length : 0;
};

// UTF-16 to UTF-8.

constexpr char Continuation(char32_t bits) noexcept {
  return static_cast<char>(0x80 | (bits & 0x3F));
}

template <class Sink>
bool PutUTF8(char32_t character, Sink& sink) noexcept {
  if (character < 0x800) {
    const char bytes[] = {static_cast<char>(0xC0 | (character >> 6)), Continuation(character)};
    return sink.Put(bytes, sizeof bytes);
  }
  if (character < 0x10000) {
    const char bytes[] = {static_cast<char>(0xE0 | (character >> 12)), Continuation(character >> 6),
                          Continuation(character)};
    return sink.Put(bytes, sizeof bytes);
  }
  const char bytes[] = {static_cast<char>(0xF0 | (character >> 18)), Continuation(character >> 12),
                        Continuation(character >> 6), Continuation(character)};
  return sink.Put(bytes, sizeof bytes);
}

constexpr auto kToUTF8 = [](const uint16_t* units, size_t left, auto& sink) -> size_t {
  const uint16_t unit = units[0];
  if (IsHighSurrogate(unit) && left > 1 && IsLowSurrogate(units[1])) {
    const char32_t offset = ((unit & 0x3FFu) << 10) | (units[1] & 0x3FFu);
    return PutUTF8(0x10000 + offset, sink) ? 2 : 0;
  }
  return PutUTF8(IsSurrogate(unit) ? kReplacementCharacter : unit, sink) ? 1 : 0;
};

// windows-1252.

// The bytes 80 to 9F; every other byte stands for the unit of the same value.
constexpr uint16_t kWindows1252[32] = {
    0x20AC, 0x0081, 0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021, 0x02C6, 0x2030, 0x0160,
    0x2039, 0x0152, 0x008D, 0x017D, 0x008F, 0x0090, 0x2018, 0x2019, 0x201C, 0x201D, 0x2022,
    0x2013, 0x2014, 0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0x009D, 0x017E, 0x0178};

constexpr uint16_t FromWindows1252(uint8_t byte) noexcept {
  return byte >= 0x80 && byte < 0xA0 ? kWindows1252[byte - 0x80] : byte;
}

constexpr auto kUnitsOfWindows1252 = [] {
  std::array<uint16_t, 256> units{};
  for (size_t byte = 0; byte < units.size(); ++byte) {
    units[byte] = FromWindows1252(static_cast<uint8_t>(byte));
  }
  return units;
}();

char Windows1252Byte(uint16_t unit) noexcept {
  if (unit >= 0xA0 && unit <= 0xFF) return static_cast<char>(unit);
  for (size_t i = 0; i < 32; ++i) {
    if (kWindows1252[i] == unit) return static_cast<char>(0x80 + i);
  }
  return '?';
}

constexpr auto kToWindows1252 = [](const uint16_t* units, size_t, auto& sink) -> size_t {
  const char byte = Windows1252Byte(units[0]);
  return sink.Put(&byte, 1) ? 1 : 0;
};

template <class Sink>
bool Convert(uint32_t codePage, const char* text, size_t count, Sink& sink) noexcept {
  return codePage == kCodePageUTF8 ? Walk(text, count, sink, kFromUTF8)
                                   : sink.PutAll(text, count, kUnitsOfWindows1252);
}

template <class Sink>
bool Convert(uint32_t codePage, const uint16_t* units, size_t count, Sink& sink) noexcept {
  return codePage == kCodePageUTF8 ? Walk(units, count, sink, kToUTF8)
                                   : Walk(units, count, sink, kToWindows1252);
}

// The contract, the same for both directions.

int Fail(uint32_t error) noexcept {
  gLastError = error;
  return 0;
}

template <class In, class Out>
int CountOrConvert(uint32_t codePage, uint32_t flags, const In* in, int count, Out* out,
                   int capacity) noexcept {
  const bool known = codePage == kCodePageSystem || codePage == kCodePageUTF8;
  const bool inGood = in != nullptr && count > 0;
  const bool outGood = capacity == 0 || (capacity > 0 && out != nullptr);
  if (!known || flags != 0 || !inGood || !outGood) return Fail(kErrorInvalidParameter);

  if (capacity == 0) {
    Counter counter;
    Convert(codePage, in, static_cast<size_t>(count), counter);
    const bool fitsInt = counter.total <= std::numeric_limits<int>::max();
    return fitsInt ? static_cast<int>(counter.total) : Fail(kErrorInvalidParameter);
  }
  Writer<Out> writer{out, static_cast<size_t>(capacity)};
  const bool fitted = Convert(codePage, in, static_cast<size_t>(count), writer);
  return fitted ? static_cast<int>(writer.total) : Fail(kErrorInsufficientBuffer);
}

}  // namespace

int MultiByteToWideChar(uint32_t codePage, uint32_t flags, const char* text, int byteCount,
                        uint16_t* units, int capacity) noexcept {
  return CountOrConvert(codePage, flags, text, byteCount, units, capacity);
}

int WideCharToMultiByte(uint32_t codePage, uint32_t flags, const uint16_t* units, int unitCount,
                        char* bytes, int capacity) noexcept {
  return CountOrConvert(codePage, flags, units, unitCount, bytes, capacity);
}

uint32_t GetLastError() noexcept {
  return gLastError;
}

}  // namespace platform
