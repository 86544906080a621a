#include "tests/platform/ConversionResults.h"

#include <algorithm>
#include <cstdint>
#include <random>

#include "platform/CodePage.h"

namespace {

using platform::kCodePageSystem;
using platform::kCodePageUTF8;
using Units = std::vector<uint16_t>;

// Every way to be malformed: what cannot begin, what is cut short, too long, a surrogate, too large.
const std::vector<std::string> kMalformed = {
    "\x80",         "\xBF",         "\xC3",         "\xE2",         "\xE2\x82",         "\xF0",         "\xF0\x9F",
    "\xF0\x9F\x98", "\xC0\x80",     "\xC1\xBF",     "\xE0\x80\x80", "\xE0\x9F\xBF",     "\xE0\x9F",     "\xF0\x80\x80\x80",
    "\xF0\x8F\xBF", "\xED\xA0\x80", "\xED\xBF\xBF", "\xED\xA0",     "\xF4\x90\x80\x80", "\xF4\x90",     "\xF5\x80\x80\x80",
    "\xF8\x88\x80", "\xFC\x84\x80", "\xFE\x80",     "\xFF",         "\xF0\x9F\x98\xC3", "\xE2\x82\x41", "\xF4\x8F\xBF"};
const std::vector<std::string> kSound = {"", "A", "\xC3\xA9", "\xE2\x82\xAC", "\xF0\x9F\x98\x80"};
constexpr uint16_t kUnits[] = {0x41, 0x7F, 0xE9, 0x20AC, 0xD800, 0xDBFF, 0xDC00, 0xDFFF, 0xFFFD, 0xFFFF};

class Report {
 public:
  std::vector<std::string> lines;

  template <class Text>
  void Add(const std::string& name, const Text& result) {
    lines.push_back(name + " = " + Hex(result));
  }

  // Takes part in the next line that AddHash makes.
  template <class Text>
  void Hash(const Text& result) {
    for (const auto each : result) hash = (hash ^ static_cast<std::make_unsigned_t<typename Text::value_type>>(each)) * 0x100000001B3;
    hash = (hash ^ 0x10000) * 0x100000001B3;
  }
  void AddHash(const std::string& name) {
    lines.push_back(name + " # " + Digits(hash, 16));
    hash = 0xCBF29CE484222325;
  }

  static std::string Digits(uint64_t number, int count) {
    std::string digits;
    while (count-- > 0) digits += "0123456789ABCDEF"[number >> 4 * count & 15];
    return digits;
  }
  template <class Text>
  static std::string Hex(const Text& text) {
    std::string digits;
    for (const auto each : text) digits += Digits(static_cast<std::make_unsigned_t<typename Text::value_type>>(each), 2 * sizeof each);
    return digits;
  }

 private:
  uint64_t hash = 0xCBF29CE484222325;
};

// The result, or why there is none. The buffer may be of another size than is needed.
Units Decoded(uint32_t codePage, const std::string& text, int capacity) {
  Units units(static_cast<size_t>(capacity));
  const int size = platform::MultiByteToWideChar(codePage, 0, text.data(), static_cast<int>(text.size()), units.data(), capacity);
  if (size == 0) return {0xEEEE, static_cast<uint16_t>(platform::GetLastError())};
  units.resize(static_cast<size_t>(size));
  return units;
}
std::string Encoded(uint32_t codePage, const Units& units, int capacity) {
  std::string bytes(static_cast<size_t>(capacity), '\0');
  const int size = platform::WideCharToMultiByte(codePage, 0, units.data(), static_cast<int>(units.size()), bytes.data(), capacity);
  if (size == 0) return "error " + std::to_string(platform::GetLastError());
  bytes.resize(static_cast<size_t>(size));
  return bytes;
}

Units Decoded(uint32_t codePage, const std::string& text) {
  const int size = platform::MultiByteToWideChar(codePage, 0, text.data(), static_cast<int>(text.size()), nullptr, 0);
  return Decoded(codePage, text, size);
}
std::string Encoded(uint32_t codePage, const Units& units) {
  const int size = platform::WideCharToMultiByte(codePage, 0, units.data(), static_cast<int>(units.size()), nullptr, 0);
  return Encoded(codePage, units, size);
}

// Whether the text ends within the length that a lead byte announces.
bool IsTruncated(const std::string& text) {
  for (size_t after = 0; after < std::min<size_t>(text.size(), 3); ++after) {
    const auto byte = static_cast<uint8_t>(text[text.size() - 1 - after]);
    const size_t announced = byte < 0xC2 || byte > 0xF4 ? 0 : byte < 0xE0 ? 1 : byte < 0xF0 ? 2 : 3;
    if (announced > after) return true;
  }
  return false;
}

// Hashes take only texts that are not truncated.
void AddMalformed(Report& report) {
  for (const std::string& malformed : kMalformed) {
    for (const std::string& before : kSound) {
      for (const std::string& after : kSound) {
        const std::string text = before + malformed + after;
        report.Add((IsTruncated(text) ? "truncated " : "utf-8 ") + Report::Hex(text), Decoded(kCodePageUTF8, text));
      }
    }
  }
  for (const std::string& first : kMalformed) {
    for (const std::string& second : kMalformed) {
      for (const char* const end : {"", "e", "en", "end"}) {
        const std::string text = "a" + first + second + end;
        if (!IsTruncated(text)) report.Hash(Decoded(kCodePageUTF8, text));
      }
    }
    report.AddHash("utf-8 " + Report::Hex(first) + " and another");
  }
}

void AddSurrogates(Report& report) {
  for (const uint16_t first : kUnits) {
    for (const uint16_t second : kUnits) {
      const Units units = {first, second};
      report.Add("utf-16 " + Report::Hex(units), Encoded(kCodePageUTF8, units));
      for (const uint16_t third : kUnits) report.Hash(Encoded(kCodePageUTF8, {'a', first, second, third}));
    }
    report.AddHash("utf-16 " + Report::Hex(Units{first}) + " and two others");
  }
}

void AddCodePage(Report& report) {
  for (int byte = 0; byte < 256; ++byte) {
    const std::string text(1, static_cast<char>(byte));
    const Units units = Decoded(kCodePageSystem, text);
    report.Add("byte " + Report::Hex(text), units);
    report.Add("unit " + Report::Hex(units), Encoded(kCodePageSystem, units));
  }
  for (uint32_t unit = 0; unit < 0x10000; ++unit) {
    const Units units = {static_cast<uint16_t>(unit)};
    const std::string byte = Encoded(kCodePageSystem, units);
    if (byte != "?" && Decoded(kCodePageSystem, byte) != units) report.Add("look-alike " + Report::Hex(units), byte);
  }
}

void AddShortBuffers(Report& report) {
  const std::string bytes = "plain, \xC3\xA9 \xE2\x82\xAC \xF0\x9F\x98\x80 \xE2\x82 end";
  const Units units = Decoded(kCodePageUTF8, bytes);
  for (const uint32_t codePage : {kCodePageSystem, kCodePageUTF8}) {
    for (int capacity = 1; capacity <= static_cast<int>(bytes.size()) + 1; ++capacity) {
      const std::string name = "code page " + std::to_string(codePage) + " into " + std::to_string(capacity);
      report.Add(name + " units", Decoded(codePage, bytes, capacity));
      report.Add(name + " bytes", Encoded(codePage, units, capacity));
    }
  }
}

void AddRandom(Report& report) {
  std::mt19937 random(1);
  const std::string edges = "a\x7F\x80\x8F\x90\x9F\xA0\xBF\xC1\xC2\xDF\xE0\xE1\xEC\xED\xEE\xEF\xF0\xF1\xF3\xF4\xF5\xFF";
  for (int block = 0; block < 64; ++block) {
    for (int round = 0; round < 500; ++round) {
      std::string bytes(1 + random() % 80, 'x');
      Units units(1 + random() % 80);
      const uint32_t plain = block % 2 == 0 ? 8 : 2;
      for (char& each : bytes) each = edges[random() % plain == 0 ? random() % edges.size() : 0];
      for (uint16_t& each : units) each = static_cast<uint16_t>(random() % 4 == 0 ? 0xD7F0 + random() % 0x820 : random() % 0x10000);
      report.Hash(Decoded(kCodePageUTF8, bytes + "end"));
      report.Hash(Decoded(kCodePageSystem, bytes));
      report.Hash(Encoded(kCodePageUTF8, units));
      report.Hash(Encoded(kCodePageSystem, Decoded(kCodePageSystem, bytes)));
    }
    report.AddHash("random " + std::to_string(block));
  }
}

}  // namespace

std::vector<std::string> ConversionResults() {
  Report report;
  AddMalformed(report);
  AddSurrogates(report);
  AddCodePage(report);
  AddShortBuffers(report);
  AddRandom(report);
  return report.lines;
}
