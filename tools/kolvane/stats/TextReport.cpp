#include <fmt/format.h>

#include <algorithm>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/cli/StandardOutput.h"
#include "tools/kolvane/stats/StatisticsReport.h"
#include "tools/kolvane/text/Characters.h"
#include "tools/kolvane/text/DisplayWidth.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

using Row = std::vector<std::string>;

Row HeaderOf(const StatisticsReport& report) {
  Row row = {"file", "keys", "words"};
  if (report.reference) {
    row.insert(row.end(), {"translated", "percent", "identical", "missing", "extra"});
  }
  row.insert(row.end(), {"buckets", "longest", "steps"});
  return row;
}

Row RowOf(const FileStatistics& file) {
  const Statistics& counts = file.statistics;
  Row row = {Printable(file.name), std::to_string(counts.keys), std::to_string(counts.words)};
  if (const auto& coverage = file.coverage) {
    row.insert(row.end(), {std::to_string(coverage->translated),
                           fmt::format("{:.1f}", TranslatedPercent(*coverage)),
                           std::to_string(coverage->identical), std::to_string(coverage->missing),
                           std::to_string(coverage->extra)});
  }
  row.insert(row.end(), {std::to_string(counts.usedBuckets), std::to_string(counts.longestChain),
                         fmt::format("{:.2f}", counts.meanSteps)});
  return row;
}

size_t WidthOf(const std::string& cell) {
  const std::vector<uint16_t> units = ToUTF16(cell);
  size_t width = 0;
  for (size_t at = 0; at < units.size();) {
    const auto [code, length] = CharacterAt(units, at);
    width += static_cast<size_t>(DisplayWidth(code));
    at += length;
  }
  return width;
}

// Names to the left, numbers to the right.
std::string AlignedTable(const std::vector<Row>& rows) {
  std::vector<size_t> widths(rows.front().size());
  for (const Row& row : rows) {
    std::ranges::transform(row, widths, widths.begin(), [](const std::string& cell, size_t width) {
      return std::max(WidthOf(cell), width);
    });
  }
  std::string table;
  for (const Row& row : rows) {
    table += row[0] + std::string(widths[0] - WidthOf(row[0]), ' ');
    for (size_t i = 1; i < row.size(); ++i) {
      table += std::string(2 + widths[i] - WidthOf(row[i]), ' ') + row[i];
    }
    table += '\n';
  }
  return table;
}

}  // namespace

void WriteTextReport(const StatisticsReport& report) {
  std::string text;
  if (const auto& reference = report.reference) {
    text = fmt::format("compared with {}, {} {}\n\n", Printable(reference->name), reference->keys,
                       reference->keys == 1 ? "key" : "keys");
  }
  std::vector<Row> rows = {HeaderOf(report)};
  std::ranges::transform(report.files, std::back_inserter(rows), RowOf);
  WriteOutput(text + AlignedTable(rows));
}
