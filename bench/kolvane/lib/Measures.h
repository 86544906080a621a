// The measures, of all subjects of one key set. Rounds of the subjects take turns, so that what
// disturbs the machine disturbs them all.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "Results.h"
#include "Subject.h"

// hit, miss        ns a query, answer copied
// load             ms; also `unload`, ms
// first-use        ms, load and every key once, in a process of its own; also, in bytes an entry,
//                  `memory-loaded` and `memory-used`: the peaks after the load and in the end
const std::vector<std::string>& MeasureNames();

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
  const int rounds;
  const Queries hits;
  const Queries misses;
};
