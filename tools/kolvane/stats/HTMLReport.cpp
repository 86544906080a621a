#include <fmt/format.h>

#include <algorithm>
#include <array>
#include <string_view>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/cli/StandardOutput.h"
#include "tools/kolvane/stats/PageStyle.h"
#include "tools/kolvane/stats/StatisticsReport.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

// Chains of about the same length, which the picture shows alike.
struct ChainClass {
  uint32_t longest;
  const char* name;
};

constexpr std::array<ChainClass, 7> kChainClasses = {{{0, "empty"},
                                                      {1, "1 entry"},
                                                      {2, "2 entries"},
                                                      {4, "3–4"},
                                                      {8, "5–8"},
                                                      {16, "9–16"},
                                                      {UINT32_MAX, "17 or more"}}};

constexpr uint32_t kBucketsInRow = 64;

size_t ClassOf(uint32_t chain) {
  const auto isHeld = [chain](const ChainClass& held) { return chain <= held.longest; };
  return static_cast<size_t>(std::ranges::find_if(kChainClasses, isHeld) - kChainClasses.begin());
}

// Names may be anything; what is no UTF-8 in them is replaced.
std::string Escaped(std::string_view name) {
  std::string escaped;
  for (const char character : ToUTF8(ToUTF16(Printable(name)))) {
    switch (character) {
      case '&':
        escaped += "&amp;";
        break;
      case '<':
        escaped += "&lt;";
        break;
      case '>':
        escaped += "&gt;";
        break;
      case '"':
        escaped += "&quot;";
        break;
      default:
        escaped += character;
    }
  }
  return escaped;
}

std::string Swatch(std::string_view style, std::string_view text) {
  return fmt::format(
      "<li><svg aria-hidden=\"true\"><rect class=\"{}\" width=\"100%\" height=\"100%\"/></svg>"
      "{}</li>\n",
      style, text);
}

std::string BarPart(std::string_view style, uint64_t before, uint64_t count, uint64_t all) {
  const auto percent = [all](uint64_t part) {
    return 100 * static_cast<double>(part) / static_cast<double>(all);
  };
  if (count == 0) return {};
  return fmt::format("<rect class=\"{}\" x=\"{:.2f}%\" width=\"{:.2f}%\" height=\"100%\"/>", style,
                     percent(before), percent(count));
}

std::string BarOf(const Coverage& coverage) {
  const uint64_t all = coverage.ReferenceKeys();
  const uint64_t present = coverage.translated + coverage.identical;
  return fmt::format(
      "<td class=\"bar\"><svg role=\"img\"><title>{} translated, {} identical, {} missing</title>"
      "{}{}{}</svg></td>\n",
      coverage.translated, coverage.identical, coverage.missing,
      BarPart("translated", 0, coverage.translated, all),
      BarPart("identical", coverage.translated, coverage.identical, all),
      BarPart("missing", present, coverage.missing, all));
}

std::string Number(std::string_view name, uint64_t count) {
  return fmt::format("<td data-name=\"{}\">{}</td>", name, count);
}

std::string RowOf(const FileStatistics& file) {
  std::string row = fmt::format("<tr><th scope=\"row\">{}</th>\n", Escaped(file.name));
  if (const auto& coverage = file.coverage) {
    row += BarOf(*coverage);
    row += fmt::format("<td class=\"percent\" data-name=\"Percent\">{:.1f} %</td>",
                       TranslatedPercent(*coverage));
    row += Number("Translated", coverage->translated) + Number("Identical", coverage->identical) +
           Number("Missing", coverage->missing) + Number("Extra", coverage->extra);
  }
  return row + Number("Keys", file.statistics.keys) + Number("Words", file.statistics.words) +
         "</tr>\n";
}

std::string TableOf(const StatisticsReport& report) {
  std::string table = "<table>\n<thead><tr><th scope=\"col\">File</th>";
  if (report.reference) {
    table += "<th scope=\"col\" class=\"bar\">Keys of the reference</th>";
    for (const char* name : {"Percent", "Translated", "Identical", "Missing", "Extra"}) {
      table += fmt::format("<th scope=\"col\">{}</th>", name);
    }
  }
  table += "<th scope=\"col\">Keys</th><th scope=\"col\">Words</th></tr></thead>\n<tbody>\n";
  for (const FileStatistics& file : report.files) table += RowOf(file);
  return table + "</tbody>\n</table>\n";
}

// A row of cells is one dashed line.
std::string EmptyBuckets() {
  std::string lines;
  for (uint32_t first = 0; first < DictionaryTable::kBucketCount; first += kBucketsInRow) {
    const uint32_t count = std::min(kBucketsInRow, DictionaryTable::kBucketCount - first);
    lines += fmt::format("M0 {}.5h{}", first / kBucketsInRow, count);
  }
  return fmt::format("<path class=\"k0\" stroke-dasharray=\".8 .2\" d=\"{}\"/>\n", lines);
}

std::string BucketPicture(const Statistics& statistics) {
  std::array<std::string, kChainClasses.size()> cells;
  for (uint32_t bucket = 0; bucket < statistics.chains.size(); ++bucket) {
    cells[ClassOf(statistics.chains[bucket])] +=
        fmt::format("M{} {}.5h.8", bucket % kBucketsInRow, bucket / kBucketsInRow);
  }
  std::string picture = EmptyBuckets();
  for (size_t i = 1; i < cells.size(); ++i) {
    if (!cells[i].empty()) picture += fmt::format("<path class=\"k{}\" d=\"{}\"/>\n", i, cells[i]);
  }
  return picture;
}

std::string ChainList(const Statistics& statistics) {
  std::array<uint32_t, kChainClasses.size()> counts = {};
  for (const uint32_t chain : statistics.chains) ++counts[ClassOf(chain)];
  std::string list = "<ul>\n";
  for (size_t i = 0; i < counts.size(); ++i) {
    if (counts[i] == 0) continue;
    list += Swatch(fmt::format("k{}", i), fmt::format("{}: {}", kChainClasses[i].name, counts[i]));
  }
  return list + "</ul>\n";
}

std::string FigureOf(const FileStatistics& file) {
  const Statistics& counts = file.statistics;
  return fmt::format(
      "<figure>\n<figcaption><b>{0}</b>{1} in use, the fullest with {2}; {3:.2f} steps to a "
      "key</figcaption>\n<svg class=\"buckets\" role=\"img\" viewBox=\"0 0 64 16\">"
      "<title>Buckets of {0}</title>\n<desc>A cell for each bucket, row by row; the darker or, on "
      "a dark page, the lighter, the more entries. The list below has the numbers.</desc>\n"
      "{4}</svg>\n{5}</figure>\n",
      Escaped(file.name), counts.usedBuckets, counts.longestChain, counts.meanSteps,
      BucketPicture(counts), ChainList(counts));
}

std::string Introduction(const StatisticsReport& report) {
  if (!report.reference) return "<h1>Dictionaries</h1>\n";
  return fmt::format(
             "<h1>Translations</h1>\n<p>Compared with {}, which has {} {}. An identical text is "
             "the "
             "reference's own, and so most likely still to be translated.</p>\n<ul>\n",
             Escaped(report.reference->name), report.reference->keys,
             report.reference->keys == 1 ? "key" : "keys") +
         Swatch("translated", "Translated") + Swatch("identical", "Identical") +
         Swatch("missing", "Missing") + "</ul>\n";
}

constexpr std::string_view kPageStart = R"(<!DOCTYPE html>
<html lang="en">
<head>
<meta charset="utf-8">
<meta name="viewport" content="width=device-width, initial-scale=1">
<title>Dictionary statistics</title>
<style>)";

constexpr std::string_view kBodyStart = R"html(</style>
</head>
<body>
<svg width="0" height="0" style="position: absolute" aria-hidden="true"><defs><pattern id="hatch"
  width="5" height="5" patternUnits="userSpaceOnUse" patternTransform="rotate(45)"><rect
  class="hatch-ground" width="5" height="5"/><path class="hatch-line" stroke-width="6"
  d="M0 0v5"/></pattern></defs></svg>
<main>
)html";

constexpr std::string_view kBucketsStart = R"(<section>
<h2>Buckets</h2>
<p>A table files its entries in 1021 buckets by their keys. Steps are the entries that a walk along a
bucket passes until it is at a key, on average.</p>
<div class="figures">
)";

}  // namespace

void WriteHTMLReport(const StatisticsReport& report) {
  std::string page(kPageStart);
  page.append(kPageStyle).append(kBodyStart);
  page += Introduction(report) + TableOf(report);
  page += kBucketsStart;
  for (const FileStatistics& file : report.files) page += FigureOf(file);
  WriteOutput(page + "</div>\n</section>\n</main>\n</body>\n</html>\n");
}
