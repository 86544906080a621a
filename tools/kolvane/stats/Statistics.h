// What a dictionary holds, in numbers.
#pragma once

#include <cstdint>
#include <vector>

#include "kolvane/lib/DictionaryTable.h"

// A key is what a lookup finds. Entries that no lookup finds, because another one of their key
// stands before them or their bucket is not their key's, are no keys; they lengthen chains.
struct Statistics {
  uint64_t keys = 0;
  uint64_t words = 0;  // of the keys' translations, as Words.h counts them

  std::vector<uint32_t> chains;  // the length of each bucket's chain, in entries
  uint32_t usedBuckets = 0;
  uint32_t longestChain = 0;

  // The entries that a walk from the head of its bucket meets until it is at a key, the key's own
  // included: their mean over all keys, rounded to hundredths; 0 without keys.
  double meanSteps = 0;
};

Statistics StatisticsOf(DictionaryTable& table);

// How a dictionary stands to its reference. Each key of the reference is translated, identical or
// missing.
struct Coverage {
  // The dictionary has a text of its own, or the very text of a reference without letters (`{0}`,
  // `100 %`, no text at all), for which there is nothing to translate.
  uint64_t translated = 0;
  uint64_t identical = 0;  // it has the reference's text, with its letters: `OK` is one, too
  uint64_t missing = 0;    // it lacks the key, or has an empty text where the reference has one
  uint64_t extra = 0;      // keys that the reference lacks

  uint64_t ReferenceKeys() const noexcept { return translated + identical + missing; }
};

Coverage CoverageOf(DictionaryTable& table, DictionaryTable& reference);

// The translated keys among the reference's, of which there is one at least, rounded down to
// tenths: 100 is said of nothing less. Identical keys count as not translated.
double TranslatedPercent(const Coverage& coverage);

// Whether that percentage, not rounded, is less than `percent`, of which six decimals count.
bool IsBelow(const Coverage& coverage, double percent);
