#include "tools/kolvane/lint/Rules.h"

#include <algorithm>

namespace {

constexpr const Rule* kRules[] = {&rules::kNoDictionary,
                                  &rules::kTooShort,
                                  &rules::kZeroCharacter,
                                  &rules::kUTF16WithoutMark,
                                  &rules::kUTF8AsCodePage,
                                  &rules::kMalformedInput,
                                  &rules::kDroppedLine,
                                  &rules::kMissingEquals,
                                  &rules::kTextOutsideQuotes,
                                  &rules::kMissingClosingQuote,
                                  &rules::kSwallowedClosingQuote,
                                  &rules::kEmptyKey,
                                  &rules::kUnmatchableKey,
                                  &rules::kMarkInKey,
                                  &rules::kMisplacedDollars,
                                  &rules::kDuplicateKey,
                                  &rules::kDuplicateAcrossFiles,
                                  &rules::kUnknownEscape,
                                  &rules::kUnknownNamedCharacter,
                                  &rules::kUnfinishedNamedCharacter,
                                  &rules::kHiddenNamedCharacter,
                                  &rules::kTruncatedImage,
                                  &rules::kDamagedImage,
                                  &rules::kUnsupportedVersion,
                                  &rules::kMisfiledEntry,
                                  &rules::kShadowedEntry,
                                  &rules::kMissingKey,
                                  &rules::kExtraKey,
                                  &rules::kEmptyTranslation,
                                  &rules::kPlaceholderMissing,
                                  &rules::kPlaceholderExtra,
                                  &rules::kPlaceholderType,
                                  &rules::kPlaceholderStyle,
                                  &rules::kAcceleratorMissing,
                                  &rules::kAcceleratorExtra,
                                  &rules::kAcceleratorClash,
                                  &rules::kLineBreaks,
                                  &rules::kEdgeSpace,
                                  &rules::kUntranslated};

}  // namespace

std::span<const Rule* const> Rules() noexcept {
  return kRules;
}

const Rule* FindRule(std::string_view name) noexcept {
  const auto found =
      std::ranges::find_if(kRules, [&](const Rule* rule) { return rule->name == name; });
  return found == std::ranges::end(kRules) ? nullptr : *found;
}
