#include "tools/kolvane/lint/PlaceholderComparison.h"

#include <fmt/format.h>
#include <fmt/ranges.h>

#include <map>
#include <set>
#include <string>
#include <string_view>
#include <utility>

#include "tools/kolvane/lint/Rules.h"

namespace {

void DropPrintf(Placeholders& placeholders) {
  std::erase_if(placeholders.all, [](const Placeholder& each) { return each.isPrintf; });
}

// Each of `some` with an argument that none of `others` nor one before it takes.
std::vector<std::string> Unmatched(const Placeholders& some, const Placeholders& others) {
  std::set<std::string_view> taken;
  for (const Placeholder& each : others.all) {
    for (const Argument& argument : each.arguments) taken.insert(argument.id);
  }
  std::vector<std::string> unmatched;
  for (const Placeholder& each : some.all) {
    bool isUnmatched = false;
    for (const Argument& argument : each.arguments) {
      isUnmatched = taken.insert(argument.id).second || isUnmatched;
    }
    if (isUnmatched) unmatched.push_back(each.written);
  }
  return unmatched;
}

// What arguments are taken for; a text may show one number in decimal and in hexadecimal digits.
struct Uses {
  std::map<std::string_view, std::string_view> written;  // of each argument the first placeholder
  std::set<std::pair<std::string_view, ArgumentType>> types;
};

Uses UsesIn(const Placeholders& placeholders) {
  Uses uses;
  for (const Placeholder& each : placeholders.all) {
    for (const Argument& argument : each.arguments) {
      uses.written.try_emplace(argument.id, each.written);
      uses.types.emplace(argument.id, argument.type);
    }
  }
  return uses;
}

// Each argument that the translation takes for a type that the reference does not, once.
std::vector<std::string> Clashes(const Placeholders& reference, const Placeholders& translation) {
  Uses expected = UsesIn(reference);
  std::vector<std::string> clashes;
  for (const Placeholder& each : translation.all) {
    for (const auto& [id, type] : each.arguments) {
      const auto written = expected.written.find(id);
      if (written == expected.written.end() || expected.types.contains({id, type})) continue;
      clashes.push_back(
          fmt::format("argument {} is {} instead of {}", id, each.written, written->second));
      expected.written.erase(written);
    }
  }
  return clashes;
}

std::string Sentence(const std::vector<std::string>& placeholders, std::string_view what) {
  const bool isOne = placeholders.size() == 1;
  return fmt::format("{} {} {} {}", isOne ? "placeholder" : "placeholders",
                     fmt::join(placeholders, ", "), isOne ? "is" : "are", what);
}

}  // namespace

std::vector<Difference> ComparePlaceholders(Placeholders reference, Placeholders translation) {
  const bool isFormat = !reference.isPlainPercent;
  const bool mixesStyles = isFormat && translation.MixesStyles();
  if (!isFormat || mixesStyles || reference.MixesStyles()) {
    DropPrintf(reference);
    DropPrintf(translation);
  }

  std::vector<Difference> differences;
  if (const auto missing = Unmatched(reference, translation); !missing.empty()) {
    differences.push_back(
        {&rules::kPlaceholderMissing, Sentence(missing, "missing from the translation")});
  }
  if (const auto extra = Unmatched(translation, reference); !extra.empty()) {
    differences.push_back({&rules::kPlaceholderExtra, Sentence(extra, "not in the reference")});
  }
  if (const auto clashes = Clashes(reference, translation); !clashes.empty()) {
    differences.push_back({&rules::kPlaceholderType, fmt::format("{}", fmt::join(clashes, ", "))});
  }
  if (mixesStyles) {
    differences.push_back({&rules::kPlaceholderStyle,
                           fmt::format("numbered {} and unnumbered {} stand in one text",
                                       translation.firstNumbered, translation.firstUnnumbered)});
  }
  return differences;
}
