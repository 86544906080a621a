#include "Results.h"

#include <algorithm>

boost::json::array Results::Records(const KeySet& set) const {
  boost::json::array records;
  for (const auto& [what, values] : rounds) {
    std::vector<double> sorted = values;
    std::sort(sorted.begin(), sorted.end());
    records.push_back({{"set", set.name},
                       {"size", set.Size()},
                       {"subject", what.first},
                       {"measure", what.second},
                       {"value", sorted.front()},
                       {"median", sorted[sorted.size() / 2]}});
  }
  return records;
}
