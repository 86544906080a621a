#include "kolvane/lib/NamedCharacters.h"

#include <algorithm>
#include <iterator>

namespace tovali_private {
namespace {

// Four controls, then the entity names of HTML 4: those of Latin-1 and the special ones.
constexpr NamedCharacter kNamedCharacters[] = {
    {"endl", {0x000D, 0x000A}}, {"tab", {0x0009}},    {"cr", {0x000D}},     {"lf", {0x000A}},
    {"nbsp", {0x00A0}},         {"iexcl", {0x00A1}},  {"cent", {0x00A2}},   {"pound", {0x00A3}},
    {"curren", {0x00A4}},       {"yen", {0x00A5}},    {"brvbar", {0x00A6}}, {"sect", {0x00A7}},
    {"uml", {0x00A8}},          {"copy", {0x00A9}},   {"ordf", {0x00AA}},   {"laquo", {0x00AB}},
    {"not", {0x00AC}},          {"shy", {0x00AD}},    {"reg", {0x00AE}},    {"macr", {0x00AF}},
    {"deg", {0x00B0}},          {"plusmn", {0x00B1}}, {"sup2", {0x00B2}},   {"sup3", {0x00B3}},
    {"acute", {0x00B4}},        {"micro", {0x00B5}},  {"para", {0x00B6}},   {"middot", {0x00B7}},
    {"cedil", {0x00B8}},        {"sup1", {0x00B9}},   {"ordm", {0x00BA}},   {"raquo", {0x00BB}},
    {"frac14", {0x00BC}},       {"frac12", {0x00BD}}, {"frac34", {0x00BE}}, {"iquest", {0x00BF}},
    {"Agrave", {0x00C0}},       {"Aacute", {0x00C1}}, {"Acirc", {0x00C2}},  {"Atilde", {0x00C3}},
    {"Auml", {0x00C4}},         {"Aring", {0x00C5}},  {"AElig", {0x00C6}},  {"Ccedil", {0x00C7}},
    {"Egrave", {0x00C8}},       {"Eacute", {0x00C9}}, {"Ecirc", {0x00CA}},  {"Euml", {0x00CB}},
    {"Igrave", {0x00CC}},       {"Iacute", {0x00CD}}, {"Icirc", {0x00CE}},  {"Iuml", {0x00CF}},
    {"ETH", {0x00D0}},          {"Ntilde", {0x00D1}}, {"Ograve", {0x00D2}}, {"Oacute", {0x00D3}},
    {"Ocirc", {0x00D4}},        {"Otilde", {0x00D5}}, {"Ouml", {0x00D6}},   {"times", {0x00D7}},
    {"Oslash", {0x00D8}},       {"Ugrave", {0x00D9}}, {"Uacute", {0x00DA}}, {"Ucirc", {0x00DB}},
    {"Uuml", {0x00DC}},         {"Yacute", {0x00DD}}, {"THORN", {0x00DE}},  {"szlig", {0x00DF}},
    {"agrave", {0x00E0}},       {"aacute", {0x00E1}}, {"acirc", {0x00E2}},  {"atilde", {0x00E3}},
    {"auml", {0x00E4}},         {"aring", {0x00E5}},  {"aelig", {0x00E6}},  {"ccedil", {0x00E7}},
    {"egrave", {0x00E8}},       {"eacute", {0x00E9}}, {"ecirc", {0x00EA}},  {"euml", {0x00EB}},
    {"igrave", {0x00EC}},       {"iacute", {0x00ED}}, {"icirc", {0x00EE}},  {"iuml", {0x00EF}},
    {"eth", {0x00F0}},          {"ntilde", {0x00F1}}, {"ograve", {0x00F2}}, {"oacute", {0x00F3}},
    {"ocirc", {0x00F4}},        {"otilde", {0x00F5}}, {"ouml", {0x00F6}},   {"divide", {0x00F7}},
    {"oslash", {0x00F8}},       {"ugrave", {0x00F9}}, {"uacute", {0x00FA}}, {"ucirc", {0x00FB}},
    {"uuml", {0x00FC}},         {"yacute", {0x00FD}}, {"thorn", {0x00FE}},  {"yuml", {0x00FF}},
    {"quot", {0x0022}},         {"amp", {0x0026}},    {"lt", {0x003C}},     {"gt", {0x003E}},
    {"OElig", {0x0152}},        {"oelig", {0x0153}},  {"Scaron", {0x0160}}, {"scaron", {0x0161}},
    {"Yuml", {0x0178}},         {"circ", {0x02C6}},   {"tilde", {0x02DC}},  {"ensp", {0x2002}},
    {"emsp", {0x2003}},         {"thinsp", {0x2009}}, {"zwnj", {0x200C}},   {"zwj", {0x200D}},
    {"lrm", {0x200E}},          {"rlm", {0x200F}},    {"ndash", {0x2013}},  {"mdash", {0x2014}},
    {"lsquo", {0x2018}},        {"rsquo", {0x2019}},  {"sbquo", {0x201A}},  {"ldquo", {0x201C}},
    {"rdquo", {0x201D}},        {"bdquo", {0x201E}},  {"dagger", {0x2020}}, {"Dagger", {0x2021}},
    {"permil", {0x2030}},       {"lsaquo", {0x2039}}, {"rsaquo", {0x203A}}, {"euro", {0x20AC}},
};

static_assert(std::size(kNamedCharacters) == 132);

constexpr size_t kShortestName = 2;
constexpr size_t kLongestName = 6;

// The table's indices sorted by the first letter of the name, and for each ASCII letter the start
// of its range, which ends at the start of the next letter's.
struct LetterIndex {
  uint8_t places[std::size(kNamedCharacters)];
  uint8_t begins[0x80 + 1];
};

constexpr LetterIndex kLetterIndex = [] {
  LetterIndex index{};
  uint8_t count = 0;
  for (size_t letter = 0; letter < 0x80; ++letter) {
    index.begins[letter] = count;
    for (size_t place = 0; place < std::size(kNamedCharacters); ++place) {
      if (kNamedCharacters[place].name[0] != static_cast<char>(letter)) continue;
      index.places[count++] = static_cast<uint8_t>(place);
    }
  }
  index.begins[0x80] = count;
  return index;
}();

static_assert(kLetterIndex.begins[0x80] == std::size(kNamedCharacters));

std::span<const uint8_t> PlacesOf(uint16_t letter) noexcept {
  if (letter >= 0x80) return {};
  const uint8_t* const places = kLetterIndex.places;
  return {places + kLetterIndex.begins[letter], places + kLetterIndex.begins[letter + 1]};
}

}  // namespace

std::span<const NamedCharacter> NamedCharacters() noexcept {
  return kNamedCharacters;
}

const NamedCharacter* MatchNamedCharacter(std::span<const uint16_t> text) noexcept {
  if (text.size() < kShortestName + 2 || text[0] != '#' || text[1] != '{') return nullptr;
  const auto name = text.subspan(2, std::min(text.size() - 2, kLongestName + 1));
  const auto brace = std::find(name.begin(), name.end(), '}');
  if (brace == name.end()) return nullptr;
  for (const uint8_t place : PlacesOf(name[0])) {
    const NamedCharacter& named = kNamedCharacters[place];
    if (std::equal(name.begin(), brace, named.name.begin(), named.name.end())) return &named;
  }
  return nullptr;
}

}  // namespace tovali_private
