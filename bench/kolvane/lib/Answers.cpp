#include "bench/kolvane/lib/Answers.h"

#include <stdexcept>
#include <string>

namespace {

bool AnswersRight(Subject& subject, const KeySet& set, const Query& query) {
  if (query.number < set.Size()) {
    return subject.Answers(query, set.values[query.number], set.valuesInUTF8[query.number]);
  }
  const std::string_view text = query.DefaultText();
  return subject.Answers(query, std::u16string(text.begin(), text.end()), text);
}

size_t AnswerLength(const Subject& subject, const KeySet& set, const Query& query) {
  if (query.number >= set.Size()) return query.defaultLength;
  return subject.encoding == AnswerEncoding::kUTF16 ? set.values[query.number].size()
                                                    : set.valuesInUTF8[query.number].size();
}

}  // namespace

void CheckEach(Subject& subject, const KeySet& set, std::span<const Query> queries) {
  for (const Query& query : queries) {
    if (AnswersRight(subject, set, query)) continue;
    throw std::runtime_error(subject.name + " answers " + query.text + " wrongly");
  }
}

size_t AnswersLength(const Subject& subject, const KeySet& set, std::span<const Query> queries) {
  size_t length = 0;
  for (const Query& query : queries) length += AnswerLength(subject, set, query);
  return length;
}

void AskAllOf(Subject& subject, std::span<const Query> queries, size_t answersLength) {
  if (subject.AskAll(queries) == answersLength) return;
  throw std::runtime_error(subject.name + " gave a wrong answer while it was timed");
}
