// The measurements of one key set.
#pragma once

#include <boost/json/object.hpp>
#include <map>
#include <string>
#include <utility>
#include <vector>

#include "bench/kolvane/lib/Subject.h"

class Results {
 public:
  // Adds a round of a measure.
  void Note(const Subject& subject, const std::string& measure, double value) {
    rounds[{subject.name, measure}].push_back(value);
  }

  // The minimum and the median of the rounds, by subject and measure.
  boost::json::object Records() const;

 private:
  std::map<std::pair<std::string, std::string>, std::vector<double>> rounds;
};
