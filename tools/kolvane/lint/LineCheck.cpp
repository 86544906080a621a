#include "tools/kolvane/lint/LineCheck.h"

#include <fmt/format.h>

#include <algorithm>
#include <optional>
#include <span>
#include <string_view>
#include <utility>

#include "kolvane/lib/TextSyntax.h"
#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/lint/EscapeCheck.h"
#include "tools/kolvane/lint/Rules.h"
#include "tools/kolvane/text/UTF8.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

using Units = std::span<const uint16_t>;
using Split = std::optional<tovali_private::SplitText<uint16_t>>;

constexpr uint16_t kByteOrderMark = 0xFEFF;

// What is reported of one line at most; more of its kind would tell no more, and each finding keeps
// the line.
constexpr size_t kMostFaults = 20;

bool IsSpace(uint16_t unit) noexcept {
  return unit == ' ' || unit == '\t' || unit == kByteOrderMark;
}

// The units of the file's byte-order mark.
size_t MarkLength(const TextLine& line) noexcept {
  return line.number == 1 && line.text[0] == kByteOrderMark ? 1 : 0;
}

class LineCheck {
 public:
  LineCheck(const std::string& fileName, const TextLine& checkedLine, std::vector<Finding>& list)
      : file(fileName),
        line(checkedLine),
        markLength(MarkLength(line)),
        entry(tovali_private::QuotedPart(line.text)),
        split(tovali_private::SplitKolvane(entry)),
        findings(list) {
    if (!split) return;
    const auto bytes = tovali_private::ToKeyBytes(split->key);
    key.assign(bytes.begin(), bytes.end());
  }

  void Run(Definitions& definitions) {
    CheckCharacters();
    if (line.text.size() == markLength) return;
    CheckQuotes();
    if (!split) {
      Report(rules::kDroppedLine, IndexOf(entry), "the line is dropped: '$$$' is due, or no '$'");
      return;
    }
    CheckKey();
    CheckDuplicate(definitions);
    CheckEscapes();
    const KolvaneString value = tovali_private::Unescape(split->value);
    definitions.Put({key, {value.Units().begin(), value.Units().end()}, PlaceAt(IndexOf(entry))});
  }

 private:
  size_t IndexOf(Units part) const noexcept {
    return static_cast<size_t>(part.data() - line.text.data());
  }

  Place PlaceAt(size_t unit) const { return PlaceIn(file, line, unit); }

  Finding& Report(const Rule& rule, size_t unit, std::string message) {
    Finding finding{.rule = &rule, .place = PlaceAt(unit), .message = std::move(message)};
    if (split) finding.key = ToUTF8(split->key);
    return findings.emplace_back(std::move(finding));
  }

  void CheckEscapes() {
    for (const EscapeFault& fault : FaultsOfEscapes(split->value, kMostFaults)) {
      Report(*fault.rule, IndexOf(split->value) + fault.at, fault.message);
    }
  }

  void CheckCharacters() {
    size_t halves = 0;
    for (size_t at = 0; at < line.text.size();) {
      const char32_t codePoint = CodePointAt(line.text, at);
      if (IsSurrogate(codePoint) && ++halves <= kMostFaults) {
        Report(rules::kMalformedInput, at,
               fmt::format("{} is half of a character", CodePointText(codePoint)));
      }
      at += UnitCount(codePoint);
    }
    if (line.endsAtZero) {
      Report(rules::kZeroCharacter, line.text.size(), "a zero character ends the line here");
    }
  }

  void CheckQuotes() {
    if (entry.data() == line.text.data()) return;
    const size_t opening = IndexOf(entry) - 1;
    const size_t closing = IndexOf(entry) + entry.size();
    CheckOutside(markLength, opening, "text before the opening quote is ignored");
    if (closing < line.text.size()) {
      CheckOutside(closing + 1, line.text.size(),
                   "text after the closing quote is ignored; a quote in a value is written \\\"");
    } else if (entry.size() > 1 && entry.back() == '"') {
      Report(rules::kSwallowedClosingQuote, closing - 1,
             "the backslash before it makes the last quote a part of the value");
    } else if (entry.empty() || entry.back() != '\\') {
      Report(rules::kMissingClosingQuote, opening, "the quote is not closed on this line");
    }
  }

  void CheckOutside(size_t begin, size_t end, const char* message) {
    const Units part = line.text.subspan(begin, std::max(begin, end) - begin);
    const auto stray = std::find_if_not(part.begin(), part.end(), IsSpace);
    if (stray == part.end()) return;
    Report(rules::kTextOutsideQuotes, begin + static_cast<size_t>(stray - part.begin()), message);
  }

  void CheckKey() {
    const size_t at = IndexOf(split->key);
    const bool hasEquals = split->key.data() + split->key.size() != entry.data() + entry.size();
    if (markLength != 0 && at == 0) {
      Report(rules::kMarkInKey, 0,
             "the byte-order mark becomes a part of the key; quotes keep it out");
    } else if (!hasEquals) {
      Report(rules::kMissingEquals, at, "without '=' all of it is a key, with an empty value");
    } else if (key.empty()) {
      Report(rules::kEmptyKey, at, "the key is empty");
    } else {
      CheckMatchable(at);
    }
    if (markLength == 0 || at != 0) CheckDollars(at);
  }

  // White space is not trimmed, nor do other quotes than double ones count.
  void CheckDollars(size_t at) {
    constexpr std::string_view kDollars = "$$$";
    const Units folder = split->key.first(
        static_cast<size_t>(std::ranges::find(split->key, '/') - split->key.begin()));
    const bool hasDollars =
        std::search(folder.begin(), folder.end(), kDollars.begin(), kDollars.end()) != folder.end();
    if (!hasDollars && (key.empty() || key[0] != '$')) return;
    Report(
        rules::kMisplacedDollars, at,
        fmt::format("the key is '{}': '$$$' stands at the start, and once", Excerpt(KeyText(key))));
  }

  void CheckMatchable(size_t at) {
    const auto beyond = std::ranges::find_if(split->key, [](uint16_t unit) { return unit > 0x7F; });
    if (beyond == split->key.end()) return;
    const auto index = static_cast<size_t>(beyond - split->key.begin());
    std::string message =
        fmt::format("no lookup in UTF-8 matches a key of a text dictionary with {}",
                    CodePointText(CodePointAt(split->key, index)));
    if (IsValidUTF8(key))
      message += fmt::format(", but those of '{}' match this one", Excerpt(key));
    Report(rules::kUnmatchableKey, at + index, std::move(message));
  }

  void CheckDuplicate(const Definitions& definitions) {
    const Definition* const earlier = definitions.Find(key);
    if (earlier == nullptr) return;
    Report(
        rules::kDuplicateKey, IndexOf(entry),
        fmt::format("key '{}' is defined again; the last definition wins", Excerpt(KeyText(key))))
        .notes.push_back(NoteOf(earlier->first.value_or(earlier->place), "first defined here"));
  }

  const std::string& file;
  const TextLine& line;
  size_t markLength;
  Units entry;
  Split split;
  std::string key;
  std::vector<Finding>& findings;
};

}  // namespace

Place PlaceIn(const std::string& file, const TextLine& line, size_t unit) {
  const size_t markLength = MarkLength(line);
  const Units before = line.text.first(std::max(unit, markLength)).subspan(markLength);
  Place place{.file = file, .line = line.number};
  place.column = 1 + line.charactersBefore + CodePointCount(before);
  if (line.charactersBefore == 0) place.lineText = ToUTF8(line.text.subspan(markLength));
  return place;
}

void CheckLine(const std::string& file, const TextLine& line, Definitions& definitions,
               std::vector<Finding>& findings) {
  LineCheck(file, line, findings).Run(definitions);
}
