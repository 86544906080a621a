// Checks of the subjects' answers.
#pragma once

#include <cstddef>
#include <span>

#include "bench/kolvane/lib/KeySet.h"
#include "bench/kolvane/lib/Queries.h"
#include "bench/kolvane/lib/Subject.h"

// Throws if the loaded subject answers a query wrongly. The right answer for a missing key is its
// default text.
void CheckEach(Subject& subject, const KeySet& set, std::span<const Query> queries);

// Returns the total length of the subject's answers to the queries.
size_t AnswersLength(const Subject& subject, const KeySet& set, std::span<const Query> queries);

// For timed loops: asks the queries and throws if the total length differs.
void AskAllOf(Subject& subject, std::span<const Query> queries, size_t answersLength);
