// Every rule that dictionaries are checked by.
#pragma once

#include <span>

#include "Finding.h"

// In the order in which they are listed.
std::span<const Rule* const> Rules() noexcept;

// Null where there is none of that name.
const Rule* FindRule(std::string_view name) noexcept;

namespace rules {

// Of files.
extern const Rule kTooShort;
extern const Rule kZeroCharacter;
extern const Rule kUTF16WithoutMark;
extern const Rule kUTF8AsCodePage;
extern const Rule kMalformedInput;

// Of lines.
extern const Rule kDroppedLine;
extern const Rule kMissingEquals;
extern const Rule kTextOutsideQuotes;
extern const Rule kMissingClosingQuote;
extern const Rule kSwallowedClosingQuote;

// Of keys.
extern const Rule kEmptyKey;
extern const Rule kUnmatchableKey;
extern const Rule kMarkInKey;
extern const Rule kMisplacedDollars;
extern const Rule kDuplicateKey;
extern const Rule kDuplicateAcrossFiles;

// Of values.
extern const Rule kUnknownEscape;
extern const Rule kUnknownNamedCharacter;
extern const Rule kUnfinishedNamedCharacter;
extern const Rule kHiddenNamedCharacter;

// Of binary images.
extern const Rule kTruncatedImage;
extern const Rule kDamagedImage;
extern const Rule kUnsupportedVersion;
extern const Rule kMisfiledEntry;
extern const Rule kShadowedEntry;

// Of translations, beside a reference.
extern const Rule kMissingKey;
extern const Rule kExtraKey;
extern const Rule kEmptyTranslation;
extern const Rule kPlaceholderMissing;
extern const Rule kPlaceholderExtra;
extern const Rule kPlaceholderType;
extern const Rule kPlaceholderStyle;
extern const Rule kAcceleratorMissing;
extern const Rule kAcceleratorExtra;
extern const Rule kAcceleratorClash;
extern const Rule kLineBreaks;
extern const Rule kEdgeSpace;
extern const Rule kUntranslated;

}  // namespace rules
