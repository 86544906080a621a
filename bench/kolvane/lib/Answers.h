// Whether subjects answer as they should.
#pragma once

#include <cstddef>
#include <span>

#include "bench/kolvane/lib/KeySet.h"
#include "bench/kolvane/lib/Queries.h"
#include "bench/kolvane/lib/Subject.h"

// Throws when the loaded subject answers any of the queries wrongly. Where the set lacks the key,
// the default text is the right answer.
void CheckEach(Subject& subject, const KeySet& set, std::span<const Query> queries);

// How long the subject's answers to the queries are together.
size_t AnswersLength(const Subject& subject, const KeySet& set, std::span<const Query> queries);

// For timed loops: asks, and throws when the answers are not that long.
void AskAllOf(Subject& subject, std::span<const Query> queries, size_t answersLength);
