#include <fmt/format.h>

#include <algorithm>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "tools/kolvane/cli/CommandLine.h"
#include "tools/kolvane/commands/Commands.h"
#include "tools/kolvane/commands/EncodingOption.h"
#include "tools/kolvane/dictionary/DictionaryFile.h"
#include "tools/kolvane/dictionary/LoadWarnings.h"
#include "tools/kolvane/stats/StatisticsReport.h"

namespace {

constexpr const char* kAbout =
    R"(Count what dictionaries hold, and how far translations have come.

Examples:
  kolvane stats de.txt
  kolvane stats --reference en.txt --fail-under 95 *.txt
  kolvane stats --reference en.txt --format html *.txt > translations.html

keys        what translators find: each key once
words       of the translations, as white space parts them; in Chinese and Japanese, characters
translated  keys of the reference with a text of their own, or without letters to translate
identical   keys that have the reference's own text, letters and all, which is no translation yet
missing     keys of the reference that the file lacks, or has without text
extra       keys that the reference lacks
buckets     those in use of the table's 1021; longest: the most entries in one of them; steps: the
            entries that a walk passes to find a key, on average

FILE may be text, a binary image, or '-' for standard input. The reference itself is left out where
it is among the FILEs. The exit status is 1 where a file is damaged or --fail-under is missed.)";

using Format = void (*)(const StatisticsReport&);

struct Request {
  std::vector<std::string> files;
  std::optional<std::string> reference;
  FileEncoding encoding = FileEncoding::kAuto;
  std::optional<double> failUnder;
  Format format = WriteTextReport;
};

void AddOptions(CommandLine& commandLine, Request& request) {
  commandLine.BeginGroup("Comparison");
  commandLine.AddValue(
      {.names = "--reference", .text = "Compare with FILE, the original texts", .value = "FILE"},
      request.reference);
  commandLine.AddValue(
      {.names = "--fail-under",
       .text = "Status 1 where less than PERCENT is translated; identical texts count as not",
       .value = "PERCENT"},
      request.failUnder);
  commandLine.BeginGroup("Output");
  commandLine.AddChoice<Format>(
      {.names = "--format", .text = "The form of the report, else text", .value = "FORMAT"},
      {{"text", WriteTextReport},
       {"json", WriteJSONReport},
       {"csv", WriteCSVReport},
       {"html", WriteHTMLReport}},
      request.format);
  commandLine.BeginGroup("Dictionaries");
  AddEncodingOption(commandLine, request.encoding);
}

void CheckRequest(Request& request) {
  std::vector<std::string> files = request.files;
  if (request.reference) {
    files.push_back(*request.reference);
    std::erase(request.files, *request.reference);
  }
  CheckFiles(files);
  CheckFiles(request.files);
  if (!request.failUnder) return;
  if (!request.reference) throw UsageError("--fail-under takes a --reference");
  if (!(*request.failUnder >= 0 && *request.failUnder <= 100)) {
    throw UsageError("--fail-under takes a number from 0 to 100");
  }
}

class Counting {
 public:
  explicit Counting(const Request& asked) : request(asked) {}

  ExitStatus Run() {
    if (request.reference) LoadReference(*request.reference);
    for (const std::string& name : request.files) Count(name);
    request.format(report);
    return status;
  }

 private:
  void Load(const std::string& name, DictionaryTable& table) {
    const bool isWhole = LoadWithWarnings(table, ReadImageFile(name, request.encoding));
    if (!isWhole) Note(ExitStatus::kFindings);
  }

  void LoadReference(const std::string& name) {
    Load(name, reference);
    const uint64_t keys = StatisticsOf(reference).keys;
    if (keys == 0) throw Failure(Printable(name) + ": a reference without keys");
    report.reference = {name, keys};
  }

  void Count(const std::string& name) {
    DictionaryTable table;
    try {
      Load(name, table);
    } catch (const Failure& failure) {
      Say(failure.what());
      return Note(ExitStatus::kNotDone);
    }
    FileStatistics file = {name, StatisticsOf(table), std::nullopt};
    if (report.reference) file.coverage = CoverageOf(table, reference);
    CheckCoverage(file);
    report.files.push_back(std::move(file));
  }

  void CheckCoverage(const FileStatistics& file) {
    if (!request.failUnder || !IsBelow(*file.coverage, *request.failUnder)) return;
    Say(fmt::format("{}: {:.1f} % is translated, less than {} %", Printable(file.name),
                    TranslatedPercent(*file.coverage), *request.failUnder));
    Note(ExitStatus::kFindings);
  }

  void Note(ExitStatus found) { status = std::max(status, found); }

  const Request& request;
  DictionaryTable reference;
  StatisticsReport report;
  ExitStatus status = ExitStatus::kDone;
};

}  // namespace

ExitStatus RunStats(int argc, const char* const* argv) {
  Request request;
  CommandLine commandLine("kolvane stats", "FILE...", kAbout);
  AddOptions(commandLine, request);
  request.files = commandLine.Parse(argc, argv);
  CheckRequest(request);
  return Counting(request).Run();
}
