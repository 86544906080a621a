// Measures all subjects with one key set. Their rounds alternate, so that a disturbance of the
// machine affects all of them.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "bench/kolvane/lib/Results.h"
#include "bench/kolvane/lib/Subject.h"

// `hit` and `miss`: nanoseconds a query, including the copy of the answer.
// `load` and `unload`: milliseconds.
// `first-use`: milliseconds of a load and one query for each key, in a child process.
// `memory-loaded` and `memory-used`: its peak memory after the load and at the end, bytes an entry.
const std::vector<std::string>& MeasureNames();

// The measures.
const std::vector<std::string>& ResultNames();

class Measures {
 public:
  Measures(const KeySet& keySet, std::vector<std::unique_ptr<Subject>>& compared, int roundCount);

  // Throws if a subject answers a query wrongly.
  void CheckAnswers();

  void Run(const std::string& measure, Results& results);

 private:
  void Ask(const std::string& measure, const Queries& queries, Results& results);
  void Load(Results& results);
  void FirstUse(Results& results);

  const KeySet& set;
  std::vector<std::unique_ptr<Subject>>& subjects;
  std::vector<Subject*> askable;  // the subjects that give answers
  const int rounds;
  const Queries hits;
  const Queries misses;
};
