#include "Measures.h"

#include <boost/json.hpp>
#include <chrono>
#include <stdexcept>

#include "Apart.h"
#include "Memory.h"

namespace {

using Clock = std::chrono::steady_clock;

template <class Period, class Work>
double Time(const Work& work) {
  const auto start = Clock::now();
  work();
  return std::chrono::duration<double, Period>(Clock::now() - start).count();
}

using Texts = std::pair<std::u16string, std::string>;

Texts ExpectedAnswer(const KeySet& set, const Query& query) {
  return {std::u16string(set.values[query.number]), std::string(set.valuesInUTF8[query.number])};
}

Texts DefaultAnswer(const KeySet&, const Query& query) {
  const std::string_view text = query.DefaultText();
  return {std::u16string(text.begin(), text.end()), std::string(text)};
}

void CheckEach(Subject& subject, const KeySet& set, const Queries& queries,
               Texts (*expected)(const KeySet&, const Query&)) {
  for (const Query& query : queries.Once()) {
    const auto [units, bytes] = expected(set, query);
    if (subject.Answers(query, units, bytes)) continue;
    throw std::runtime_error(subject.name + " answers " + query.text + " wrongly");
  }
}

// How long all answers to the queries are together; what a timed loop is held against.
size_t ExpectedLength(const KeySet& set, const Subject& subject, std::span<const Query> queries,
                      bool areHits) {
  size_t length = 0;
  for (const Query& query : queries) {
    if (!areHits) {
      length += query.defaultLength;
    } else if (subject.yields == Yields::kUTF16) {
      length += set.values[query.number].size();
    } else {
      length += set.valuesInUTF8[query.number].size();
    }
  }
  return length;
}

void AskAllOf(Subject& subject, std::span<const Query> queries, size_t expectedLength) {
  if (subject.AskAll(queries) == expectedLength) return;
  throw std::runtime_error(subject.name + " gave a wrong answer while it was timed");
}

// Few entries load so fast that it takes more rounds to meet an undisturbed one.
int Repeats(const KeySet& set) {
  return set.Size() <= 20'000 ? 5 : 1;
}

// Loads are compared with what they cost a process that has done it before.
void WarmUp(Subject& subject) {
  subject.Load();
  subject.Unload();
  subject.Renew();
}

}  // namespace

const std::vector<std::string>& MeasureNames() {
  static const std::vector<std::string> names = {"hit", "miss", "load", "first-use"};
  return names;
}

Measures::Measures(const KeySet& keySet, std::vector<std::unique_ptr<Subject>>& compared,
                   int roundCount)
    : set(keySet),
      subjects(compared),
      rounds(roundCount),
      hits(set.keys, set.defaultTexts, 0),
      misses(set.missingKeys, set.missingDefaults, set.Size()) {}

// Apart, for a subject may remember whatever it was ever asked.
void Measures::CheckAnswers() {
  for (const auto& subject : subjects) {
    if (subject->yields == Yields::kNothing) continue;
    RunApart([&] {
      subject->Load();
      CheckEach(*subject, set, hits, ExpectedAnswer);
      CheckEach(*subject, set, misses, DefaultAnswer);
      return std::string();
    });
  }
}

void Measures::Run(const std::string& measure, Results& results) {
  if (measure == "hit") Ask(measure, hits, results);
  if (measure == "miss") Ask(measure, misses, results);
  if (measure == "load") Load(results);
  if (measure == "first-use") FirstUse(results);
}

void Measures::Ask(const std::string& measure, const Queries& queries, Results& results) {
  const auto many = queries.Many();
  for (const auto& subject : subjects) subject->Load();
  for (int round = 0; round < rounds; ++round) {
    for (const auto& subject : subjects) {
      if (subject->yields == Yields::kNothing) continue;
      const size_t expected = ExpectedLength(set, *subject, many, measure == "hit");
      subject->AskAll(queries.Once());  // the other subjects had the caches
      const double time = Time<std::nano>([&] { AskAllOf(*subject, many, expected); });
      results.Note(*subject, measure, time / static_cast<double>(many.size()));
    }
  }
  for (const auto& subject : subjects) {
    subject->Unload();
    subject->Renew();
  }
}

void Measures::Load(Results& results) {
  for (const auto& subject : subjects) WarmUp(*subject);
  for (int round = 0; round < rounds * Repeats(set); ++round) {
    for (const auto& subject : subjects) {
      TrimMemory();
      results.Note(*subject, "load", Time<std::milli>([&] { subject->Load(); }));
      results.Note(*subject, "unload", Time<std::milli>([&] { subject->Unload(); }));
      subject->Renew();
    }
  }
}

namespace {

struct FirstUseRecord {
  double time, memoryLoaded, memoryUsed;
};

FirstUseRecord MeasureFirstUse(Subject& subject, std::span<const Query> queries, size_t expected) {
  FirstUseRecord record{};
  WarmUp(subject);
  const PeakMeter meter;
  record.time = Time<std::milli>([&] { subject.Load(); });
  record.memoryLoaded = meter.PeakBytes();
  record.time += Time<std::milli>([&] { AskAllOf(subject, queries, expected); });
  record.memoryUsed = meter.PeakBytes();
  return record;
}

std::string ToText(const FirstUseRecord& record) {
  return serialize(boost::json::array{record.time, record.memoryLoaded, record.memoryUsed});
}

FirstUseRecord FromText(const std::string& text) {
  const auto values = boost::json::parse(text).as_array();
  return {values[0].as_double(), values[1].as_double(), values[2].as_double()};
}

}  // namespace

void Measures::FirstUse(Results& results) {
  const double entries = static_cast<double>(set.Size());
  for (int round = 0; round < rounds; ++round) {
    for (const auto& subject : subjects) {
      if (subject->yields == Yields::kNothing) continue;
      const size_t expected = ExpectedLength(set, *subject, hits.Once(), true);
      const auto record = FromText(
          RunApart([&] { return ToText(MeasureFirstUse(*subject, hits.Once(), expected)); }));
      results.Note(*subject, "first-use", record.time);
      results.Note(*subject, "memory-loaded", record.memoryLoaded / entries);
      results.Note(*subject, "memory-used", record.memoryUsed / entries);
    }
  }
}
