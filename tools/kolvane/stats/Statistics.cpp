#include "tools/kolvane/stats/Statistics.h"

#include <algorithm>
#include <cmath>

#include "tools/kolvane/lint/Comparison.h"
#include "tools/kolvane/text/Words.h"

using tovali_private::DictionaryEntry;
using tovali_private::HashItem;

namespace {

// Calls visit(entry, position) for each key of a bucket, with its place in the chain from 1, and
// returns the chain's length.
template <class Visit>
uint32_t WalkBucket(DictionaryTable& table, uint32_t bucket, Visit visit) {
  uint32_t position = 0;
  for (const HashItem* item = table.Bucket(bucket); item != nullptr; item = item->next) {
    const auto& entry = static_cast<const DictionaryEntry&>(*item);
    ++position;
    if (table.Find(entry) == &entry) visit(entry, position);
  }
  return position;
}

void Classify(const DictionaryEntry& wanted, const DictionaryEntry* found, Coverage& coverage) {
  const auto original = wanted.Value().Units();
  const auto hasLetter = [&] { return HasLetter(original, FindPlaceholders(original)); };
  if (found == nullptr || (found->Value().Units().empty() && !original.empty())) {
    ++coverage.missing;
  } else if (std::ranges::equal(found->Value().Units(), original) && hasLetter()) {
    ++coverage.identical;
  } else {
    ++coverage.translated;
  }
}

}  // namespace

Statistics StatisticsOf(DictionaryTable& table) {
  Statistics statistics;
  uint64_t steps = 0;
  const auto count = [&](const DictionaryEntry& entry, uint32_t position) {
    ++statistics.keys;
    statistics.words += CountWords(entry.Value().Units());
    steps += position;
  };
  for (uint32_t bucket = 0; bucket < DictionaryTable::kBucketCount; ++bucket) {
    const uint32_t length = WalkBucket(table, bucket, count);
    statistics.chains.push_back(length);
    statistics.usedBuckets += length != 0 ? 1 : 0;
    statistics.longestChain = std::max(statistics.longestChain, length);
  }
  const uint64_t keys = std::max<uint64_t>(statistics.keys, 1);
  const uint64_t hundredths = (steps * 100 + keys / 2) / keys;
  statistics.meanSteps = static_cast<double>(hundredths) / 100;
  return statistics;
}

Coverage CoverageOf(DictionaryTable& table, DictionaryTable& reference) {
  Coverage coverage;
  for (uint32_t bucket = 0; bucket < DictionaryTable::kBucketCount; ++bucket) {
    WalkBucket(reference, bucket, [&](const DictionaryEntry& entry, uint32_t) {
      Classify(entry, table.Find(entry), coverage);
    });
    WalkBucket(table, bucket, [&](const DictionaryEntry& entry, uint32_t) {
      coverage.extra += reference.Find(entry) == nullptr ? 1 : 0;
    });
  }
  return coverage;
}

double TranslatedPercent(const Coverage& coverage) {
  const uint64_t tenths = coverage.translated * 1000 / coverage.ReferenceKeys();
  return static_cast<double>(tenths) / 10;
}

bool IsBelow(const Coverage& coverage, double percent) {
  constexpr uint64_t kMillion = 1'000'000;
  const auto millionths = static_cast<uint64_t>(std::llround(percent * double{kMillion}));
  return coverage.translated * 100 * kMillion < millionths * coverage.ReferenceKeys();
}
