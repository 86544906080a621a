// The conversion layer against its contract, and against ICU.
#include <gtest/gtest.h>

#include <random>
#include <string>
#include <vector>

#include "CodePage.h"
#include "ICUConversion.h"

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

TEST(CodePage, ConvertsWindows1252AsICUDoes) {
  ICUWindows1252 icu;
  for (int byte = 0; byte < 256; ++byte) {
    const auto character = static_cast<char>(byte);
    ASSERT_EQ(Decoded(kCodePageSystem, {character})[0], icu.Decode(character)) << byte;
  }
  for (char32_t unit = 0; unit < 0x10000; ++unit) {
    const auto character = static_cast<char16_t>(unit);
    ASSERT_EQ(Encoded(kCodePageSystem, {character})[0], icu.Encode(character)) << static_cast<uint32_t>(unit);
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
