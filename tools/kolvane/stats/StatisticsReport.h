// What `kolvane stats` tells, in the forms that people and programs read.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "tools/kolvane/stats/Statistics.h"

struct FileStatistics {
  std::string name;  // as the user gave it
  Statistics statistics;
  std::optional<Coverage> coverage;  // where there is a reference
};

struct StatisticsReport {
  struct Reference {
    std::string name;
    uint64_t keys = 0;
  };

  std::optional<Reference> reference;
  std::vector<FileStatistics> files;  // in the order of the command line
};

// Each writes the whole report to standard output, in UTF-8, and throws what WriteOutput throws.
// The same report is the same text on every machine.

// A table for people at a terminal.
void WriteTextReport(const StatisticsReport& report);

// One object, with `version` 1; what there is only beside a reference is left out of it.
void WriteJSONReport(const StatisticsReport& report);

// A row of names and a row for each file; quoted as RFC 4180 says, with LF at the end of each row.
void WriteCSVReport(const StatisticsReport& report);

// One page for a team to look at: it needs nothing but itself, and runs no script.
void WriteHTMLReport(const StatisticsReport& report);
