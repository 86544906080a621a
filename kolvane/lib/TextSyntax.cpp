#include "kolvane/lib/TextSyntax.h"

#include <algorithm>
#include <string_view>

#include "kolvane/lib/NamedCharacters.h"
#include "kolvane/lib/Scan.h"

namespace tovali_private {
namespace {

using Units = std::span<const uint16_t>;

constexpr uint16_t kQuote = '"';
constexpr uint16_t kCaret = '^';
constexpr uint16_t kBackslash = '\\';

size_t KeyLength(std::span<const char> text) noexcept {
  return std::min(std::string_view(text.data(), text.size()).find('='), text.size());
}

size_t KeyLength(Units text) noexcept {
  return DelimiterSet<'='>::FindFirst(text);
}

// Returns the index of the first double quote from `start` on that no backslash immediately
// precedes, or the line's length. Only the unit before a quote counts: `\\"` is escaped too.
size_t FindQuote(Units line, size_t start) noexcept {
  for (size_t at = start;; ++at) {
    at += DelimiterSet<kQuote>::FindFirst(line.subspan(at));
    if (at == line.size() || at == 0 || line[at - 1] != kBackslash) return at;
  }
}

struct Escape {
  char letter;
  uint16_t character;
};

constexpr Escape kCaretEscapes[] = {{'Q', 0x0022}, {'[', 0x201C}, {']', 0x201D}, {'{', 0x2018},
                                    {'}', 0x2019}, {'C', 0x00A9}, {'R', 0x00AE}, {'T', 0x2122},
                                    {'D', 0x00B0}, {'B', 0x2022}, {'#', 0x2318}, {'!', 0x00AC},
                                    {'I', 0x2206}, {'S', 0x2211}, {'n', 0x000A}, {'r', 0x000D}};

constexpr Escape kBackslashEscapes[] = {
    {'"', 0x0022}, {'n', 0x000A}, {'r', 0x000D}, {'t', 0x0009}, {'b', 0x0008}};

constexpr bool IsEscapeCharacter(uint16_t unit) noexcept {
  return unit == kCaret || unit == kBackslash;
}

const Escape* FindEscape(uint16_t escapeCharacter, uint16_t letter) noexcept {
  const std::span<const Escape> table = escapeCharacter == kCaret
                                            ? std::span<const Escape>(kCaretEscapes)
                                            : std::span<const Escape>(kBackslashEscapes);
  const auto found = std::find_if(table.begin(), table.end(),
                                  [&](const Escape& escape) { return escape.letter == letter; });
  return found == table.end() ? nullptr : &*found;
}

// Returns the end of the decoded text.
uint16_t* DecodeEscapes(Units text, uint16_t* out) noexcept {
  for (;;) {
    const size_t plain = DelimiterSet<kCaret, kBackslash>::FindFirst(text);
    out = std::copy_n(text.begin(), plain, out);
    text = text.subspan(plain);
    if (text.empty()) return out;
    const EscapeToken start = DecodeNext(text);
    out = std::copy_n(start.units, start.count, out);
    text = text.subspan(start.taken);
  }
}

// Works in place, because a name is longer than its character. Returns the end of the result.
uint16_t* ExpandNamedCharacters(uint16_t* text, uint16_t* end) noexcept {
  uint16_t* out = std::find(text, end, '#');
  for (const uint16_t* in = out; in != end;) {
    const NamedCharacter* named = *in == '#' ? MatchNamedCharacter(Units(in, end)) : nullptr;
    if (named == nullptr) {
      *out++ = *in++;
      continue;
    }
    for (const uint16_t unit : named->Units()) *out++ = unit;
    in += named->WrittenLength();
  }
  return out;
}

// Returns the letter that represents a unit after a backslash, or 0 if the unit needs no escape.
constexpr char LetterFor(uint16_t unit) noexcept {
  switch (unit) {
    case '\n':
      return 'n';
    case '\r':
      return 'r';
    case kQuote:
      return '"';
    default:
      return 0;
  }
}

bool IsWritableKey(std::span<const uint8_t> key) noexcept {
  for (size_t i = 0; i < key.size(); ++i) {
    const uint8_t byte = key[i];
    if (byte == 0 || byte == '\n' || byte == '\r' || byte == '=') return false;
    if (byte == kQuote && (i == 0 || key[i - 1] != kBackslash)) return false;
  }
  return true;
}

UnwritableReason UnwritableReasonOf(Units value) noexcept {
  for (; !value.empty(); value = value.subspan(1)) {
    switch (value.front()) {
      case 0:
        return UnwritableReason::kZeroCharacter;
      case kLineSeparatorUnit:
      case kParagraphSeparatorUnit:
        return UnwritableReason::kLineSeparator;
      case '#':
        if (MatchNamedCharacter(value) != nullptr) return UnwritableReason::kNamedCharacter;
    }
  }
  return UnwritableReason::kNone;
}

constexpr bool IsInvisible(uint16_t unit) noexcept {
  return unit == 0x00A0 || unit == 0x00AD || (unit >= 0x2000 && unit <= 0x200F);
}

// Returns the name of an invisible character, or null.
const NamedCharacter* NameOfInvisible(uint16_t unit) noexcept {
  if (!IsInvisible(unit)) return nullptr;
  const auto names = NamedCharacters();
  const auto found = std::find_if(names.begin(), names.end(), [unit](const NamedCharacter& named) {
    return named.character[0] == unit;
  });
  return found == names.end() ? nullptr : &*found;
}

void AppendEscaped(uint16_t unit, std::vector<uint16_t>& line) {
  if (const NamedCharacter* const named = NameOfInvisible(unit)) {
    line.insert(line.end(), {'#', '{'});
    line.insert(line.end(), named->name.begin(), named->name.end());
    line.push_back('}');
    return;
  }
  const Escape* const escape =
      std::find_if(std::begin(kBackslashEscapes), std::end(kBackslashEscapes),
                   [unit](const Escape& each) { return each.character == unit; });
  if (escape != std::end(kBackslashEscapes)) {
    line.push_back(kBackslash);
    unit = static_cast<uint16_t>(escape->letter);
  } else if (IsEscapeCharacter(unit)) {
    line.push_back(unit);
  }
  line.push_back(unit);
}

}  // namespace

Units QuotedPart(Units line) noexcept {
  const size_t opening = FindQuote(line, 0);
  if (opening == line.size()) return line;
  const size_t closing = FindQuote(line, opening + 1);
  return line.subspan(opening + 1, closing - opening - 1);
}

KeyBytes ToKeyBytes(Units key) {
  KeyBytes bytes(key.size(), boost::container::default_init);
  std::transform(key.begin(), key.end(), bytes.begin(),
                 [](uint16_t unit) { return static_cast<uint8_t>(unit); });
  return bytes;
}

EscapeToken DecodeNext(Units text) noexcept {
  const uint16_t unit = text[0];
  if (!IsEscapeCharacter(unit)) return {EscapeToken::kPlain, 1, 1, {unit}};
  if (text.size() == 1) return {EscapeToken::kUnfinishedEscape, 1, 1, {unit}};
  const uint16_t letter = text[1];
  if (letter == unit) return {EscapeToken::kEscape, 2, 1, {unit}};
  const Escape* const escape = FindEscape(unit, letter);
  if (escape == nullptr) return {EscapeToken::kUnknownEscape, 2, 2, {unit, letter}};
  return {EscapeToken::kEscape, 2, 1, {escape->character}};
}

template <class Unit>
std::optional<SplitText<Unit>> SplitKolvane(std::span<const Unit> text) noexcept {
  if (!text.empty() && text[0] == '$') {
    if (text.size() < 3 || text[1] != '$' || text[2] != '$') return std::nullopt;
    text = text.subspan(3);
  }
  const size_t keyLength = KeyLength(text);
  const size_t valueStart = std::min(keyLength + 1, text.size());
  return SplitText<Unit>{text.first(keyLength), text.subspan(valueStart)};
}

template std::optional<SplitText<char>> SplitKolvane(std::span<const char>) noexcept;
template std::optional<SplitText<uint16_t>> SplitKolvane(std::span<const uint16_t>) noexcept;

Units Unescape(Units text, std::vector<uint16_t>& decoded) {
  if (EscapeStarts::FindFirst(text) == text.size()) return text;
  decoded.resize(text.size());
  uint16_t* const end = ExpandNamedCharacters(decoded.data(), DecodeEscapes(text, decoded.data()));
  decoded.resize(static_cast<size_t>(end - decoded.data()));
  return decoded;
}

KolvaneString Unescape(Units text) {
  std::vector<uint16_t> decoded;
  const Units units = Unescape(text, decoded);
  return {units.data(), static_cast<uint32_t>(units.size())};
}

std::optional<std::vector<uint16_t>> EscapeForText(Units text) {
  const auto escaped = std::count_if(text.begin(), text.end(), LetterFor);
  if (escaped == 0) return std::nullopt;
  std::vector<uint16_t> written;
  written.reserve(text.size() + static_cast<size_t>(escaped));
  for (const uint16_t unit : text) {
    const char letter = LetterFor(unit);
    if (letter != 0) written.push_back(kBackslash);
    written.push_back(letter != 0 ? static_cast<uint16_t>(letter) : unit);
  }
  return written;
}

UnwritableReason AppendLine(std::span<const uint8_t> key, Units value,
                            std::vector<uint16_t>& line) {
  if (!IsWritableKey(key)) return UnwritableReason::kKey;
  const UnwritableReason obstacle = UnwritableReasonOf(value);
  if (obstacle != UnwritableReason::kNone) return obstacle;
  line.insert(line.end(), {kQuote, '$', '$', '$'});
  line.insert(line.end(), key.begin(), key.end());
  line.push_back('=');
  for (const uint16_t unit : value) AppendEscaped(unit, line);
  if (line.back() != kBackslash) line.push_back(kQuote);
  return UnwritableReason::kNone;
}

}  // namespace tovali_private
