#include "bench/kolvane/lib/Measures.h"

#include <boost/json.hpp>
#include <chrono>
#include <utility>

#include "bench/kolvane/lib/Answers.h"
#include "bench/kolvane/lib/Memory.h"
#include "bench/kolvane/lib/Subprocess.h"

namespace {

using Clock = std::chrono::steady_clock;

template <class Period, class Work>
double Time(const Work& work) {
  const auto start = Clock::now();
  work();
  return std::chrono::duration<double, Period>(Clock::now() - start).count();
}

constexpr size_t kFewEntries = 20'000;
constexpr size_t kManyEntries = 200'000;

// Short measures get more rounds, so that at least one of them is undisturbed.
int Repeats(const KeySet& set) {
  if (set.Size() <= kFewEntries) return 5;
  return set.Size() <= kManyEntries ? 2 : 1;
}

// The first load warms caches and the allocator; it is not measured.
void WarmUp(Subject& subject) {
  subject.Load();
  subject.Unload();
  subject.PrepareReload();
}

struct FirstUseRecord {
  double time, memoryLoaded, memoryUsed;
};

FirstUseRecord MeasureFirstUse(Subject& subject, std::span<const Query> queries, size_t length) {
  FirstUseRecord record{};
  if (queries.size() <= kFewEntries) WarmUp(subject);
  const PeakMeter meter;
  record.time = Time<std::milli>([&] { subject.Load(); });
  record.memoryLoaded = meter.PeakBytes();
  record.time += Time<std::milli>([&] { AskAllOf(subject, queries, length); });
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

const std::vector<std::string>& MeasureNames() {
  static const std::vector<std::string> names = {"hit", "miss", "load", "first-use"};
  return names;
}

const std::vector<std::string>& ResultNames() {
  static const std::vector<std::string> names = {
      "hit", "miss", "load", "unload", "first-use", "memory-loaded", "memory-used"};
  return names;
}

Measures::Measures(const KeySet& keySet, std::vector<std::unique_ptr<Subject>>& compared,
                   int roundCount)
    : set(keySet),
      subjects(compared),
      rounds(roundCount),
      hits(set.keys, set.defaultTexts, 0),
      misses(set.missingKeys, set.missingDefaults, set.Size()) {
  for (const auto& subject : subjects) {
    if (subject->encoding != AnswerEncoding::kNothing) askable.push_back(subject.get());
  }
}

// In a child process, because some subjects cache every answer.
void Measures::CheckAnswers() {
  for (Subject* const subject : askable) {
    RunInChild([&] {
      subject->Load();
      CheckEach(*subject, set, hits.Once());
      CheckEach(*subject, set, misses.Once());
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
  std::vector<size_t> lengths;
  for (Subject* const subject : askable) {
    lengths.push_back(AnswersLength(*subject, set, many));
    subject->Load();
  }
  for (int round = 0; round < rounds * Repeats(set); ++round) {
    for (size_t i = 0; i < askable.size(); ++i) {
      if (set.Size() <= kManyEntries)
        askable[i]->AskAll(queries.Once());  // refills the caches after other subjects
      const double time = Time<std::nano>([&] { AskAllOf(*askable[i], many, lengths[i]); });
      results.Note(*askable[i], measure, time / static_cast<double>(many.size()));
    }
  }
  for (Subject* const subject : askable) {
    subject->Unload();
    subject->PrepareReload();
  }
}

void Measures::Load(Results& results) {
  for (const auto& subject : subjects) WarmUp(*subject);
  for (int round = 0; round < rounds * Repeats(set); ++round) {
    for (const auto& subject : subjects) {
      TrimMemory();
      results.Note(*subject, "load", Time<std::milli>([&] { subject->Load(); }));
      results.Note(*subject, "unload", Time<std::milli>([&] { subject->Unload(); }));
      subject->PrepareReload();
    }
  }
}

// Fewer rounds for many entries: they take longest and vary least.
void Measures::FirstUse(Results& results) {
  const auto once = hits.Once();
  const double entries = static_cast<double>(set.Size());
  const int roundCount = set.Size() <= kManyEntries ? rounds : (rounds + 1) / 2;
  for (int round = 0; round < roundCount; ++round) {
    for (Subject* const subject : askable) {
      const size_t length = AnswersLength(*subject, set, once);
      const auto record =
          FromText(RunInChild([&] { return ToText(MeasureFirstUse(*subject, once, length)); }));
      results.Note(*subject, "first-use", record.time);
      results.Note(*subject, "memory-loaded", record.memoryLoaded / entries);
      results.Note(*subject, "memory-used", record.memoryUsed / entries);
    }
  }
}
