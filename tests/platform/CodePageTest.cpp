// The conversion layer against its contract, and against ICU.
#include <gtest/gtest.h>
#include <unicode/ucnv.h>
#include <unicode/unistr.h>

#include <algorithm>
#include <memory>
#include <random>
#include <regex>
#include <string>

#include "CodePage.h"

namespace {

using platform::kCodePageSystem;
using platform::kCodePageUTF8;

// Both directions by way of the contract: count first, then convert into exactly that much.
std::u16string Decoded(uint32_t codePage, const std::string& text) {
  const int count = static_cast<int>(text.size());
  const int size = platform::MultiByteToWideChar(codePage, 0, text.data(), count, nullptr, 0);
  std::vector<uint16_t> units(static_cast<size_t>(size));
  EXPECT_EQ(size, platform::MultiByteToWideChar(codePage, 0, text.data(), count, units.data(), size));
  return {units.begin(), units.end()};
}

std::string Encoded(uint32_t codePage, const std::u16string& text) {
  const std::vector<uint16_t> units(text.begin(), text.end());
  const int count = static_cast<int>(units.size());
  const int size = platform::WideCharToMultiByte(codePage, 0, units.data(), count, nullptr, 0);
  std::string bytes(static_cast<size_t>(size), '\0');
  EXPECT_EQ(size, platform::WideCharToMultiByte(codePage, 0, units.data(), count, bytes.data(), size));
  return bytes;
}

// What counts as one here and as several with ICU: a lead byte with a second one that does not fit it,
// and a lead byte with all that is left where that is too little.
std::string WithMisfitsAsOne(const std::string& text) {
  static const std::regex misfits("\xE0[\x80-\x9F]|\xED[\xA0-\xBF]|\xF0[\x80-\x8F]|\xF4[\x90-\xBF]");
  std::string whole = text;
  for (size_t at = text.size() - std::min<size_t>(text.size(), 3); at < text.size(); ++at) {
    const auto byte = static_cast<unsigned char>(text[at]);
    const size_t length = byte < 0xC2 || byte > 0xF4 ? 1 : byte < 0xE0 ? 2 : byte < 0xF0 ? 3 : 4;
    if (text.size() - at >= length) continue;
    whole.resize(at);
    whole += '\xFF';
    break;
  }
  return std::regex_replace(whole, misfits, "\xFF");
}

std::u16string ICUDecodedUTF8(const std::string& text) {
  const auto decoded = icu::UnicodeString::fromUTF8(WithMisfitsAsOne(text));
  return {decoded.getBuffer(), static_cast<size_t>(decoded.length())};
}

std::string ICUEncodedUTF8(const std::u16string& text) {
  std::string encoded;
  return icu::UnicodeString(text.data(), static_cast<int32_t>(text.size())).toUTF8String(encoded);
}

// Bytes around which UTF-8 changes its mind.
constexpr unsigned char kEdges[] = {0x00, 0x41, 0x7F, 0x80, 0x8F, 0x90, 0x9F, 0xA0, 0xBF, 0xC0, 0xC1, 0xC2, 0xDF,
                                    0xE0, 0xE1, 0xEC, 0xED, 0xEE, 0xEF, 0xF0, 0xF1, 0xF3, 0xF4, 0xF5, 0xFF};

// Calls `check` with every text of `length` characters of the alphabet.
template <class Alphabet, class Text, class Check>
void ForEveryText(const Alphabet& alphabet, size_t length, Text& text, const Check& check) {
  if (length == 0) return check();
  for (const auto character : alphabet) {
    text.push_back(static_cast<typename Text::value_type>(character));
    ForEveryText(alphabet, length - 1, text, check);
    text.pop_back();
  }
}

TEST(CodePage, DecodesUTF8AsICUDoes) {
  for (size_t length = 1; length <= 4; ++length) {
    std::string text;
    ForEveryText(kEdges, length, text, [&] { ASSERT_EQ(Decoded(kCodePageUTF8, text), ICUDecodedUTF8(text)); });
  }
}

TEST(CodePage, EncodesUTF8AsICUDoes) {
  constexpr char16_t kUnits[] = {0, 0x7F, 0x80, 0x7FF, 0x800, 0xD7FF, 0xD800, 0xDBFF, 0xDC00, 0xDFFF, 0xE000, 0xFFFD, 0xFFFF, 'a'};
  for (size_t length = 1; length <= 4; ++length) {
    std::u16string text;
    ForEveryText(kUnits, length, text, [&] { ASSERT_EQ(Encoded(kCodePageUTF8, text), ICUEncodedUTF8(text)); });
  }
}

// Long texts, where runs of ASCII are taken eight bytes at a time.
TEST(CodePage, ConvertsLongMixedTextsAsICUDoes) {
  std::mt19937 random(1);
  for (int round = 0; round < 3000; ++round) {
    std::string bytes;
    std::u16string units;
    for (size_t length = random() % 80; length > 0; --length) {
      const bool plain = random() % 8 != 0;
      bytes += static_cast<char>(plain ? 'a' + random() % 26 : kEdges[random() % 25]);
      units += static_cast<char16_t>(plain ? 'a' + random() % 26 : random() % 0x10000);
    }
    if (bytes.empty()) continue;
    ASSERT_EQ(Decoded(kCodePageUTF8, bytes), ICUDecodedUTF8(bytes));
    ASSERT_EQ(Encoded(kCodePageUTF8, units), ICUEncodedUTF8(units));
  }
}

class ICUWindows1252 {
 public:
  ICUWindows1252() : converter(ucnv_open("windows-1252", &error), &ucnv_close) {
    ucnv_setSubstChars(converter.get(), "?", 1, &error);
    ucnv_setFallback(converter.get(), false);
  }
  char16_t Decode(char byte) {
    char16_t unit = 0;
    ucnv_toUChars(converter.get(), &unit, 1, &byte, 1, &error);
    return unit;
  }
  char Encode(char16_t unit) {
    char byte = 0;
    const int32_t length = ucnv_fromUChars(converter.get(), &byte, 1, &unit, 1, &error);
    return length == 1 ? byte : '?';  // ICU leaves out what is invisible anyway
  }

 private:
  UErrorCode error = U_ZERO_ERROR;
  std::unique_ptr<UConverter, decltype(&ucnv_close)> converter;
};

TEST(CodePage, ConvertsWindows1252AsICUDoes) {
  ICUWindows1252 icu;
  for (int byte = 0; byte < 256; ++byte) {
    const auto character = static_cast<char>(byte);
    ASSERT_EQ(Decoded(kCodePageSystem, {character})[0], icu.Decode(character)) << byte;
  }
  for (char32_t unit = 0; unit < 0x10000; ++unit) {
    const auto character = static_cast<char16_t>(unit);
    const bool surrogate = unit >= 0xD800 && unit < 0xE000;
    const char expected = surrogate ? '?' : icu.Encode(character);
    ASSERT_EQ(Encoded(kCodePageSystem, {character})[0], expected) << static_cast<uint32_t>(unit);
  }
}

TEST(CodePage, RefusesEveryShortBuffer) {
  const std::string text = "plain text, \xE2\x82\xAC and \xF0\x9F\x98\x80!";
  const std::u16string decoded = Decoded(kCodePageUTF8, text);
  std::vector<uint16_t> units(decoded.begin(), decoded.end());
  std::string bytes(text.size(), '\0');
  const auto unitCount = static_cast<int>(units.size());
  const auto byteCount = static_cast<int>(bytes.size());
  for (int capacity = 1; capacity < unitCount; ++capacity) {
    std::vector<uint16_t> exact(static_cast<size_t>(capacity));  // the sanitizer minds its end
    EXPECT_EQ(0, platform::MultiByteToWideChar(kCodePageUTF8, 0, text.data(), byteCount, exact.data(), capacity));
    EXPECT_EQ(platform::GetLastError(), platform::kErrorInsufficientBuffer);
  }
  for (int capacity = 1; capacity < byteCount; ++capacity) {
    std::vector<char> exact(static_cast<size_t>(capacity));
    EXPECT_EQ(0, platform::WideCharToMultiByte(kCodePageUTF8, 0, units.data(), unitCount, exact.data(), capacity));
    EXPECT_EQ(platform::GetLastError(), platform::kErrorInsufficientBuffer);
  }
}

TEST(CodePage, RefusesWhatBreaksItsRules) {
  uint16_t units[4];
  struct {
    uint32_t codePage, flags;
    const char* text;
    int count;
    uint16_t* out;
    int capacity;
  } const cases[] = {
      {1252, 0, "a", 1, units, 4},           {kCodePageUTF8, 8, "a", 1, units, 4},  {kCodePageUTF8, 0, nullptr, 1, units, 4},
      {kCodePageUTF8, 0, "a", 0, units, 4},  {kCodePageUTF8, 0, "a", -1, units, 4}, {kCodePageUTF8, 0, "a", 1, nullptr, 4},
      {kCodePageUTF8, 0, "a", 1, units, -1},
  };
  for (const auto& each : cases) {
    EXPECT_EQ(0, platform::MultiByteToWideChar(each.codePage, each.flags, each.text, each.count, each.out, each.capacity));
    EXPECT_EQ(platform::GetLastError(), platform::kErrorInvalidParameter) << &each - cases;
  }
}

}  // namespace
