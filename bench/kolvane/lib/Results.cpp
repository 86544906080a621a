#include "bench/kolvane/lib/Results.h"

#include <algorithm>

boost::json::object Results::Records() const {
  boost::json::object records;
  for (const auto& [what, values] : rounds) {
    std::vector<double> sorted = values;
    std::sort(sorted.begin(), sorted.end());
    auto& measures = records[what.first];
    if (!measures.is_object()) measures.emplace_object();
    measures.as_object()[what.second] = {{"least", sorted.front()},
                                         {"median", sorted[sorted.size() / 2]}};
  }
  return records;
}
