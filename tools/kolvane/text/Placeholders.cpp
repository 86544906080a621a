#include "tools/kolvane/text/Placeholders.h"

#include <algorithm>
#include <utility>

#include "tools/kolvane/text/Characters.h"

namespace {

using Units = std::span<const uint16_t>;

constexpr size_t kNone = SIZE_MAX;

constexpr bool IsInName(uint16_t unit) {
  return (unit >= 'a' && unit <= 'z') || (unit >= 'A' && unit <= 'Z') ||
         (unit >= '0' && unit <= '9') || unit == '_' || unit == '.' || unit == '-';
}

// The text holds ASCII only.
std::string Written(Units text) {
  std::string written;
  for (const uint16_t unit : text) written += static_cast<char>(unit);
  return written;
}

// For each opening brace where the one that closes it stands, or kNone.
std::vector<size_t> ClosingBraces(Units text) {
  std::vector<size_t> closing(text.size(), kNone);
  std::vector<size_t> open;
  for (size_t at = 0; at < text.size(); ++at) {
    if (text[at] == '{') open.push_back(at);
    if (text[at] != '}' || open.empty()) continue;
    closing[open.back()] = at;
    open.pop_back();
  }
  return closing;
}

class Finder {
 public:
  explicit Finder(Units searched) : text(searched) {}

  Placeholders Find() {
    while (at < text.size()) {
      if (text[at] == '%') {
        FindAtPercent();
      } else if (text[at] == '{') {
        FindAtBrace();
      } else {
        ++at;
      }
    }
    found.isPlainPercent = hasPlainPercent && !hasFormat;
    return std::move(found);
  }

 private:
  bool IsDoubled() const { return at + 1 < text.size() && text[at + 1] == text[at]; }

  void FindAtPercent() {
    if (IsDoubled()) {
      hasFormat = true;
      at += 2;
    } else if (const auto directive = ParsePrintfDirective(text.subspan(at))) {
      hasFormat = true;
      AddDirective(*directive);
    } else {
      hasPlainPercent = true;
      ++at;
    }
  }

  void AddDirective(const PrintfDirective& directive) {
    std::vector<Argument> arguments;
    const std::string written = Written(text.subspan(at, directive.length));
    for (size_t i = 0; i < directive.argumentCount; ++i) {
      const auto [number, type] = directive.arguments[i];
      std::string& first = number == 0 ? found.firstUnnumbered : found.firstNumbered;
      if (first.empty()) first = written;
      arguments.push_back({std::to_string(number == 0 ? ++unnumberedCount : number), type});
    }
    Add({at, directive.length, written, true, std::move(arguments)});
  }

  void FindAtBrace() {
    if (IsDoubled()) {
      at += 2;
      return;
    }
    const size_t nameEnd = NameEnd();
    const size_t closing = ClosingBrace(nameEnd);
    if (closing == kNone) {
      ++at;
      return;
    }
    const std::string id = Written(text.subspan(at, nameEnd - at)) + '}';
    Add({at, closing + 1 - at, id, false, {{id, {}}}});
  }

  // The end of the name behind the brace, or the brace's own where there is none.
  size_t NameEnd() const {
    const Units rest = text.subspan(at + 1);
    if (rest.empty() || rest[0] == '.' || rest[0] == '-') return at + 1;
    const auto end = std::ranges::find_if_not(rest, IsInName);
    return at + 1 + static_cast<size_t>(end - rest.begin());
  }

  size_t ClosingBrace(size_t nameEnd) {
    if (nameEnd == at + 1 || nameEnd == text.size()) return kNone;
    if (text[nameEnd] == '}') return nameEnd;
    if (!BeginsFormat(nameEnd)) return kNone;
    if (closingBraces.empty()) closingBraces = ClosingBraces(text);
    return closingBraces[at];
  }

  bool BeginsFormat(size_t start) const {
    if (text[start] == ',') return true;
    return text[start] == ':' && start + 1 < text.size() && !IsWhiteSpace(text[start + 1]);
  }

  void Add(Placeholder placeholder) {
    at += placeholder.length;
    found.all.push_back(std::move(placeholder));
  }

  const Units text;
  size_t at = 0;
  size_t unnumberedCount = 0;
  bool hasFormat = false;
  bool hasPlainPercent = false;
  std::vector<size_t> closingBraces;  // made when they are needed first
  Placeholders found;
};

}  // namespace

Placeholders FindPlaceholders(Units text) {
  return Finder(text).Find();
}
