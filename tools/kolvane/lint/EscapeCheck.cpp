#include "tools/kolvane/lint/EscapeCheck.h"

#include <fmt/format.h>

#include <algorithm>

#include "kolvane/lib/NamedCharacters.h"
#include "kolvane/lib/TextSyntax.h"
#include "tools/kolvane/lint/Rules.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

using tovali_private::EscapeToken;
using tovali_private::MatchNamedCharacter;
using Units = std::span<const uint16_t>;

constexpr size_t kMostNameUnits = 32;  // what is longer was not meant for a name

bool IsNameUnit(uint16_t unit) noexcept {
  return unit > ' ' && unit != '#' && unit != '{' && unit != '}';
}

// Goes through a value as Unescape does, and keeps of each unit that comes out where it came from.
// Names are looked for after the escapes, of which any may stand before them or behind.
class EscapeCheck {
 public:
  EscapeCheck(Units checked, size_t mostFaults)
      : value(checked), most(mostFaults), room(mostFaults) {}

  std::vector<EscapeFault> Run() {
    for (size_t at = 0; at < value.size();) at += TakeEscape(at);
    room = most;
    for (size_t at = 0; at < decoded.size() && room != 0; ++at) CheckName(at);
    std::ranges::stable_sort(faults, {}, &EscapeFault::at);
    if (faults.size() > most) faults.resize(most);
    return std::move(faults);
  }

 private:
  size_t TakeEscape(size_t at) {
    const EscapeToken start = tovali_private::DecodeNext(value.subspan(at));
    if (room != 0) CheckEscape(start, at);
    for (size_t i = 0; i < start.count; ++i) {
      decoded.push_back(start.units[i]);
      origins.push_back(at + (start.count == start.taken ? i : 0));
    }
    return start.taken;
  }

  void CheckEscape(const EscapeToken& start, size_t at) {
    if (start.kind == EscapeToken::kUnknownEscape) {
      const size_t length = 1 + UnitCount(CodePointAt(value, at + 1));
      Report(
          rules::kUnknownEscape, at,
          fmt::format("'{}' is no escape and stays as it is", ToUTF8(value.subspan(at, length))));
    } else if (start.kind == EscapeToken::kUnfinishedEscape) {
      Report(rules::kUnknownEscape, at,
             fmt::format("'{}' at the end escapes nothing", ToUTF8(value.subspan(at, 1))));
    } else if (start.taken == 2 && value[at + 1] == '#') {
      CheckHidden(at + 1);
    }
  }

  void CheckHidden(size_t at) {
    const auto* const named = MatchNamedCharacter(value.subspan(at));
    if (named == nullptr) return;
    Report(rules::kHiddenNamedCharacter, at - 1,
           fmt::format("'^#' is an escape, which leaves '{{{}}}' as it is", named->name));
  }

  void CheckName(size_t at) {
    const Units text = Units(decoded).subspan(at);
    if (text.size() < 2 || text[0] != '#' || text[1] != '{') return;
    if (MatchNamedCharacter(text) != nullptr) return;
    const Units rest = text.subspan(2, std::min(text.size() - 2, kMostNameUnits + 1));
    const auto nameEnd = std::ranges::find_if_not(rest, IsNameUnit);
    const auto length = static_cast<size_t>(nameEnd - rest.begin());
    if (length > kMostNameUnits) return;
    if (nameEnd != rest.end() && *nameEnd == '}') {
      Report(rules::kUnknownNamedCharacter, origins[at],
             fmt::format("'{}' names no character and stays as it is", Spelt(text, length + 3)));
    } else {
      Report(
          rules::kUnfinishedNamedCharacter, origins[at],
          fmt::format("'{}' lacks its closing brace and stays as it is", Spelt(text, length + 2)));
    }
  }

  static std::string Spelt(Units text, size_t length) { return ToUTF8(text.first(length)); }

  void Report(const Rule& rule, size_t at, std::string message) {
    faults.push_back({&rule, at, std::move(message)});
    --room;
  }

  Units value;
  size_t most;
  size_t room;  // for what is found of one kind
  std::vector<uint16_t> decoded;
  std::vector<size_t> origins;
  std::vector<EscapeFault> faults;
};

}  // namespace

std::vector<EscapeFault> FaultsOfEscapes(Units value, size_t most) {
  if (tovali_private::EscapeStarts::FindFirst(value) == value.size()) return {};
  return EscapeCheck(value, most).Run();
}
