// The measures, of all subjects of one key set. Rounds of the subjects take turns, so that what
// disturbs the machine disturbs them all.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "bench/kolvane/lib/Results.h"
#include "bench/kolvane/lib/Subject.h"

// `hit` and `miss` are in nanoseconds a query, with the answer copied.
// `load` is in milliseconds, and has `unload` beside it.
// `first-use` is the milliseconds of a load and every key once, in a process of its own. Beside it,
// in bytes an entry, are the peaks after the load and in the end: `memory-loaded`, `memory-used`.
const std::vector<std::string>& MeasureNames();

// The measures and what is beside them.
const std::vector<std::string>& ResultNames();

class Measures {
 public:
  Measures(const KeySet& keySet, std::vector<std::unique_ptr<Subject>>& compared, int roundCount);

  // Throws when a subject gives a wrong answer to any query.
  void CheckAnswers();

  void Run(const std::string& measure, Results& results);

 private:
  void Ask(const std::string& measure, const Queries& queries, Results& results);
  void Load(Results& results);
  void FirstUse(Results& results);

  const KeySet& set;
  std::vector<std::unique_ptr<Subject>>& subjects;
  std::vector<Subject*> askable;  // those of them that yield anything
  const int rounds;
  const Queries hits;
  const Queries misses;
};
