#include "tools/kolvane/text/PrintfDirective.h"

#include <algorithm>
#include <string_view>

namespace {

using Units = std::span<const uint16_t>;

constexpr size_t kLargestNumber = 9999;
constexpr ArgumentType kInteger = {'d', 0};

struct Modifier {
  std::string_view text;
  char size;
};

// One that another begins with comes after it.
constexpr Modifier kModifiers[] = {{"hh", 'H'}, {"h", 'h'}, {"ll", 'q'}, {"l", 'l'}, {"L", 'L'},
                                   {"q", 'q'},  {"j", 'q'}, {"z", 'z'},  {"t", 'z'}, {"I64", 'q'},
                                   {"I32", 0},  {"I", 'z'}, {"w", 'l'}};

struct Conversion {
  std::string_view letters;
  char conversion;
  std::string_view sizes;  // those that make a difference
};

constexpr Conversion kConversions[] = {
    {"di", 'd', "HhlqLz"}, {"uoxX", 'u', "HhlqLz"}, {"fFeEgGaA", 'f', "L"},
    {"c", 'c', "hl"},      {"C", 'C', ""},          {"s", 's', "hl"},
    {"S", 'S', ""},        {"p", 'p', ""},          {"n", 'n', "HhlqLz"}};

bool IsOneOf(std::string_view characters, uint16_t unit) {
  return unit < 0x80 && characters.find(static_cast<char>(unit)) != characters.npos;
}

class Parser {
 public:
  explicit Parser(Units parsed) : text(parsed) {}

  std::optional<PrintfDirective> Parse() {
    size_t number = 0;
    if (!ParseNumber(number)) return std::nullopt;
    const bool isHyphenated = ParseFlags();
    const size_t widthAt = at;
    if (!ParseWidth()) return std::nullopt;
    if (isHyphenated && at == widthAt) return std::nullopt;
    if (Skip(".") && !ParseWidth()) return std::nullopt;
    const char size = ParseModifier();
    if (!ParseConversion(number, size)) return std::nullopt;
    directive.length = at;
    return directive;
  }

 private:
  bool Skip(std::string_view expected) {
    if (text.size() - at < expected.size()) return false;
    if (!std::ranges::equal(text.subspan(at, expected.size()), expected)) return false;
    at += expected.size();
    return true;
  }

  // Of however many digits, but no larger than one above the largest number.
  size_t ParseDigits() {
    size_t value = 0;
    for (; at < text.size() && IsOneOf("0123456789", text[at]); ++at) {
      value = std::min(value * 10 + (text[at] - '0'), kLargestNumber + 1);
    }
    return value;
  }

  // Of the form `n$`, or absent; false where it is out of range.
  bool ParseNumber(size_t& number) {
    const size_t start = at;
    const size_t value = ParseDigits();
    if (at == start || !Skip("$")) {
      at = start;
      return true;
    }
    number = value;
    return number >= 1 && number <= kLargestNumber;
  }

  // Returns whether one of them is a minus sign.
  bool ParseFlags() {
    const size_t start = at;
    while (at < text.size() && IsOneOf("-+#0'", text[at])) ++at;
    const Units flags = text.subspan(start, at - start);
    return std::ranges::find(flags, '-') != flags.end();
  }

  bool ParseWidth() {
    if (!Skip("*")) {
      ParseDigits();
      return true;
    }
    size_t number = 0;
    if (!ParseNumber(number)) return false;
    Add(number, kInteger);
    return true;
  }

  char ParseModifier() {
    for (const Modifier& modifier : kModifiers) {
      if (Skip(modifier.text)) return modifier.size;
    }
    return 0;
  }

  bool ParseConversion(size_t number, char size) {
    if (at == text.size()) return false;
    for (const Conversion& each : kConversions) {
      if (!IsOneOf(each.letters, text[at])) continue;
      const bool differs = each.sizes.find(size) != each.sizes.npos;
      Add(number, {each.conversion, differs ? size : '\0'});
      ++at;
      return true;
    }
    return false;
  }

  void Add(size_t number, ArgumentType type) {
    directive.arguments[directive.argumentCount++] = {number, type};
  }

  const Units text;
  size_t at = 1;  // behind the `%`
  PrintfDirective directive;
};

}  // namespace

std::optional<PrintfDirective> ParsePrintfDirective(Units text) {
  return Parser(text).Parse();
}
