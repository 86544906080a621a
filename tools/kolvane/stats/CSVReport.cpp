#include <fmt/format.h>

#include <string_view>

#include "tools/kolvane/cli/StandardOutput.h"
#include "tools/kolvane/stats/StatisticsReport.h"

namespace {

std::string Quoted(std::string_view text) {
  if (text.find_first_of(",\"\r\n") == std::string_view::npos) return std::string(text);
  std::string quoted = "\"";
  for (const char character : text) {
    if (character == '"') quoted += '"';
    quoted += character;
  }
  return quoted + '"';
}

std::string RowOf(const FileStatistics& file) {
  const Statistics& counts = file.statistics;
  std::string row = fmt::format("{},{},{},", Quoted(file.name), counts.keys, counts.words);
  if (const auto& coverage = file.coverage) {
    row += fmt::format("{},{},{},{},{:.1f},", coverage->translated, coverage->identical,
                       coverage->missing, coverage->extra, TranslatedPercent(*coverage));
  }
  return row +
         fmt::format("{},{},{:.2f}\n", counts.usedBuckets, counts.longestChain, counts.meanSteps);
}

}  // namespace

void WriteCSVReport(const StatisticsReport& report) {
  std::string rows = "file,keys,words,";
  if (report.reference) rows += "translated,identical,missing,extra,translatedPercent,";
  rows += "usedBuckets,longestChain,meanSteps\n";
  for (const FileStatistics& file : report.files) rows += RowOf(file);
  WriteOutput(rows);
}
