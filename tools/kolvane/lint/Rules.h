// Every rule that dictionaries are checked by.
#pragma once

#include <span>

#include "tools/kolvane/lint/Finding.h"

// In the order in which they are listed.
std::span<const Rule* const> Rules() noexcept;

// Null where there is none of that name.
const Rule* FindRule(std::string_view name) noexcept;

namespace rules {

using enum Severity;

// Of files.
inline constexpr Rule kNoDictionary = {"no-dictionary", kError,
                                       "the file is of another kind, such as PO, XML or JSON"};
inline constexpr Rule kTooShort = {
    "too-short", kError, "the file has too few bytes to be loaded; a translator ignores it"};
inline constexpr Rule kZeroCharacter = {
    "zero-character", kError, "a zero character cuts a line, or the rest of the file, off"};
inline constexpr Rule kUTF16WithoutMark = {
    "utf-16-without-mark", kError, "text in UTF-16 lacks the byte-order mark that tells so"};
inline constexpr Rule kUTF8AsCodePage = {
    "utf-8-as-code-page", kWarning,
    "text in UTF-8 is read in the code page when it is loaded as it is"};
inline constexpr Rule kMalformedInput = {"malformed-input", kError,
                                         "bytes that are no character in the file's encoding"};

// Of lines.
inline constexpr Rule kDroppedLine = {
    "dropped-line", kError, "a line is dropped, for it begins with one or two dollar signs"};
inline constexpr Rule kMissingEquals = {
    "missing-equals", kWarning, "a line without '=' is a key as a whole, with an empty value"};
inline constexpr Rule kTextOutsideQuotes = {"text-outside-quotes", kWarning,
                                            "text outside the quotes is ignored"};
inline constexpr Rule kMissingClosingQuote = {"missing-closing-quote", kWarning,
                                              "an opening quote has no closing quote on its line"};
inline constexpr Rule kSwallowedClosingQuote = {
    "swallowed-closing-quote", kError,
    "a backslash makes the last quote a part of the value instead of its end"};

// Of keys.
inline constexpr Rule kEmptyKey = {"empty-key", kWarning, "a definition has an empty key"};
inline constexpr Rule kUnmatchableKey = {"unmatchable-key", kError,
                                         "no lookup in UTF-8 can match the key"};
inline constexpr Rule kMarkInKey = {"mark-in-key", kError,
                                    "the byte-order mark sticks to a first key without quotes"};
inline constexpr Rule kMisplacedDollars = {
    "misplaced-dollars", kError, "what stands before or behind '$$$' becomes a part of the key"};
inline constexpr Rule kDuplicateKey = {"duplicate-key", kError,
                                       "a key is defined more than once; the last definition wins"};
inline constexpr Rule kDuplicateAcrossFiles = {"duplicate-across-files", kInfo,
                                               "a key is defined in more than one of the files"};

// Of values.
inline constexpr Rule kUnknownEscape = {
    "unknown-escape", kWarning, "an escape that does not exist stays in the value as it is"};
inline constexpr Rule kUnknownNamedCharacter = {
    "unknown-named-character", kWarning, "#{name} with a name that does not exist stays as it is"};
inline constexpr Rule kUnfinishedNamedCharacter = {
    "unfinished-named-character", kWarning, "#{name without its closing brace stays as it is"};
inline constexpr Rule kHiddenNamedCharacter = {
    "hidden-named-character", kWarning,
    "^# is a character of its own, so that the {name} behind it stays as it is"};

// Of binary images.
inline constexpr Rule kTruncatedImage = {"truncated-image", kError,
                                         "a binary image ends before what it announces"};
inline constexpr Rule kDamagedImage = {"damaged-image", kError,
                                       "a binary image contradicts itself"};
inline constexpr Rule kUnsupportedVersion = {"unsupported-version", kError,
                                             "a binary image is of a version that nothing reads"};
inline constexpr Rule kMisfiledEntry = {
    "misfiled-entry", kError, "an entry lies in a bucket where no lookup of its key finds it"};
inline constexpr Rule kShadowedEntry = {
    "shadowed-entry", kWarning, "an entry of a binary image hides behind another of its key"};

// Of translations, beside a reference.
inline constexpr Rule kMissingKey = {"missing-key", kWarning,
                                     "a key of the reference has no translation"};
inline constexpr Rule kExtraKey = {"extra-key", kWarning,
                                   "a translation has no key in the reference"};
inline constexpr Rule kEmptyTranslation = {"empty-translation", kWarning,
                                           "the translation is empty, the reference is not"};
inline constexpr Rule kPlaceholderMissing = {
    "placeholder-missing", kError, "the translation lacks a placeholder of the reference"};
inline constexpr Rule kPlaceholderExtra = {
    "placeholder-extra", kError, "the translation has a placeholder that the reference lacks"};
inline constexpr Rule kPlaceholderType = {
    "placeholder-type", kError,
    "a placeholder takes another type of argument than the reference's"};
inline constexpr Rule kPlaceholderStyle = {
    "placeholder-style", kError, "numbered and unnumbered placeholders stand in one text"};
inline constexpr Rule kAcceleratorMissing = {"accelerator-missing", kWarning,
                                             "the translation lacks the reference's accelerator"};
inline constexpr Rule kAcceleratorExtra = {"accelerator-extra", kWarning,
                                           "the translation has more accelerators than are due"};
inline constexpr Rule kAcceleratorClash = {"accelerator-clash", kWarning,
                                           "two siblings have the same accelerator"};
inline constexpr Rule kLineBreaks = {
    "line-breaks", kWarning, "the translation has more or fewer line breaks than the reference"};
inline constexpr Rule kEdgeSpace = {
    "edge-space", kWarning,
    "white space at the start or end is missing, or is not in the reference"};
inline constexpr Rule kUntranslated = {"untranslated", kInfo,
                                       "the translation is a copy of the reference"};

}  // namespace rules
