// What was measured of one key set.
#pragma once

#include <boost/json/array.hpp>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "Subject.h"

class Results {
 public:
  // One more round of a measure.
  void Note(const Subject& subject, const std::string& measure, double value) {
    rounds[{subject.name, measure}].push_back(value);
  }

  // A record for each subject and measure, with the least and the median of its rounds.
  boost::json::array Records(const KeySet& set) const;

 private:
  std::map<std::pair<std::string, std::string>, std::vector<double>> rounds;
};
