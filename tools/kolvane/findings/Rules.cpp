#include "Rules.h"

#include <algorithm>

namespace rules {

using enum Severity;

constexpr Rule kTooShort = {"too-short", kError,
                            "the file has too few bytes to be loaded; a translator ignores it"};
constexpr Rule kZeroCharacter = {"zero-character", kError,
                                 "a zero character cuts a line, or the rest of the file, off"};
constexpr Rule kUTF16WithoutMark = {"utf-16-without-mark", kError,
                                    "text in UTF-16 lacks the byte-order mark that tells so"};
constexpr Rule kUTF8AsCodePage = {
    "utf-8-as-code-page", kWarning,
    "text in UTF-8 is read in the code page when it is loaded as it is"};
constexpr Rule kMalformedInput = {"malformed-input", kError,
                                  "bytes that are no character in the file's encoding"};

constexpr Rule kDroppedLine = {"dropped-line", kError,
                               "a line is dropped, for it begins with one or two dollar signs"};
constexpr Rule kMissingEquals = {"missing-equals", kWarning,
                                 "a line without '=' is a key as a whole, with an empty value"};
constexpr Rule kTextOutsideQuotes = {"text-outside-quotes", kWarning,
                                     "text outside the quotes is ignored"};
constexpr Rule kMissingClosingQuote = {"missing-closing-quote", kWarning,
                                       "an opening quote has no closing quote on its line"};
constexpr Rule kSwallowedClosingQuote = {
    "swallowed-closing-quote", kError,
    "a backslash makes the last quote a part of the value instead of its end"};

constexpr Rule kEmptyKey = {"empty-key", kWarning, "a definition has an empty key"};
constexpr Rule kUnmatchableKey = {"unmatchable-key", kError,
                                  "no lookup in UTF-8 can match the key"};
constexpr Rule kMarkInKey = {"mark-in-key", kError,
                             "the byte-order mark sticks to a first key without quotes"};
constexpr Rule kMisplacedDollars = {"misplaced-dollars", kError,
                                    "what stands before or behind '$$$' becomes a part of the key"};
constexpr Rule kDuplicateKey = {"duplicate-key", kError,
                                "a key is defined more than once; the last definition wins"};
constexpr Rule kDuplicateAcrossFiles = {"duplicate-across-files", kInfo,
                                        "a key is defined in more than one of the files"};

constexpr Rule kUnknownEscape = {"unknown-escape", kWarning,
                                 "an escape that does not exist stays in the value as it is"};
constexpr Rule kUnknownNamedCharacter = {"unknown-named-character", kWarning,
                                         "#{name} with a name that does not exist stays as it is"};
constexpr Rule kUnfinishedNamedCharacter = {"unfinished-named-character", kWarning,
                                            "#{name without its closing brace stays as it is"};
constexpr Rule kHiddenNamedCharacter = {
    "hidden-named-character", kWarning,
    "^# is a character of its own, so that the {name} behind it stays as it is"};

constexpr Rule kTruncatedImage = {"truncated-image", kError,
                                  "a binary image ends before what it announces"};
constexpr Rule kDamagedImage = {"damaged-image", kError, "a binary image contradicts itself"};
constexpr Rule kUnsupportedVersion = {"unsupported-version", kError,
                                      "a binary image is of a version that nothing reads"};
constexpr Rule kMisfiledEntry = {"misfiled-entry", kError,
                                 "an entry lies in a bucket where no lookup of its key finds it"};
constexpr Rule kShadowedEntry = {"shadowed-entry", kWarning,
                                 "an entry of a binary image hides behind another of its key"};

constexpr Rule kMissingKey = {"missing-key", kWarning, "a key of the reference has no translation"};
constexpr Rule kExtraKey = {"extra-key", kWarning, "a translation has no key in the reference"};
constexpr Rule kEmptyTranslation = {"empty-translation", kWarning,
                                    "the translation is empty, the reference is not"};
constexpr Rule kPlaceholderMissing = {"placeholder-missing", kError,
                                      "the translation lacks a placeholder of the reference"};
constexpr Rule kPlaceholderExtra = {"placeholder-extra", kError,
                                    "the translation has a placeholder that the reference lacks"};
constexpr Rule kPlaceholderType = {
    "placeholder-type", kError,
    "a placeholder takes another type of argument than the reference's"};
constexpr Rule kPlaceholderStyle = {"placeholder-style", kError,
                                    "numbered and unnumbered placeholders stand in one text"};
constexpr Rule kAcceleratorMissing = {"accelerator-missing", kWarning,
                                      "the translation lacks the reference's accelerator"};
constexpr Rule kAcceleratorExtra = {"accelerator-extra", kWarning,
                                    "the translation has more accelerators than are due"};
constexpr Rule kAcceleratorClash = {"accelerator-clash", kWarning,
                                    "two siblings have the same accelerator"};
constexpr Rule kLineBreaks = {"line-breaks", kWarning,
                              "the translation has more or fewer line breaks than the reference"};
constexpr Rule kEdgeSpace = {
    "edge-space", kWarning,
    "white space at the start or end is missing, or is not in the reference"};
constexpr Rule kUntranslated = {"untranslated", kInfo,
                                "the translation is a copy of the reference"};

}  // namespace rules

namespace {

constexpr const Rule* kRules[] = {&rules::kTooShort,
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
