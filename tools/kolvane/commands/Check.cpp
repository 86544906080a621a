#include <fmt/format.h>

#include <algorithm>
#include <new>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "tools/kolvane/cli/Colour.h"
#include "tools/kolvane/cli/CommandLine.h"
#include "tools/kolvane/cli/StandardOutput.h"
#include "tools/kolvane/commands/Commands.h"
#include "tools/kolvane/commands/EncodingOption.h"
#include "tools/kolvane/dictionary/ImageFile.h"
#include "tools/kolvane/lint/DictionaryCheck.h"
#include "tools/kolvane/lint/Rules.h"
#include "tools/kolvane/lint/report/Baseline.h"
#include "tools/kolvane/lint/report/Fingerprints.h"
#include "tools/kolvane/lint/report/Reports.h"

namespace {

constexpr const char* kAbout =
    R"(Tell what is wrong with dictionaries, each finding with its place and rule.

Examples:
  kolvane check de.txt fr.txt
  kolvane check --reference en.txt -W de.txt
  kolvane check --format=json *.txt > old.json; kolvane check --baseline old.json *.txt
  kolvane check --list-rules

FILE may be '-' for standard input. The exit status is 0 where nothing was found that counts as
failure, 1 where something was, and 2 where a file could not be read.)";

enum class ReportFormat { kText, kJSON, kSARIF, kGitHub };

struct Request {
  std::vector<std::string> files;
  std::optional<std::string> reference;
  FileEncoding encoding = FileEncoding::kAuto;
  std::vector<std::string> disabledRules;
  std::optional<std::string> baseline;
  Severity failOn = Severity::kError;
  bool info = false;
  ReportFormat format = ReportFormat::kText;
  bool noSnippet = false;
  ColourChoice colour = ColourChoice::kAuto;
  bool quiet = false;
  bool listRules = false;
};

void AddDictionaryOptions(CommandLine& commandLine, Request& request) {
  commandLine.BeginGroup("Dictionaries");
  commandLine.AddValue({.names = "--reference",
                        .text = "Compare each FILE, as a translation, with this dictionary",
                        .value = "FILE"},
                       request.reference);
  AddEncodingOption(commandLine, request.encoding);
}

void AddFindingOptions(CommandLine& commandLine, Request& request) {
  commandLine.BeginGroup("Findings");
  commandLine.AddValues(
      {.names = "--disable", .text = "Leave out what RULE finds", .value = "RULE"},
      request.disabledRules);
  commandLine.AddValue({.names = "--baseline",
                        .text = "Leave out what FILE has, an earlier report in JSON",
                        .value = "FILE"},
                       request.baseline);
  commandLine.AddFlag({.names = "--info", .text = "Show cosmetic findings too"}, request.info);
  commandLine.AddChoice<Severity>(
      {.names = "--fail-on",
       .text = "The least that counts as failure (error, unless told)",
       .value = "SEVERITY"},
      {{"error", Severity::kError}, {"warning", Severity::kWarning}, {"info", Severity::kInfo}},
      request.failOn);
  commandLine.AddFlag({.names = "-W", .text = "The same as --fail-on=warning"},
                      [&] { request.failOn = std::min(request.failOn, Severity::kWarning); });
}

void AddReportOptions(CommandLine& commandLine, Request& request) {
  commandLine.BeginGroup("Report");
  commandLine.AddChoice<ReportFormat>({.names = "--format",
                                       .text = "How findings are written (text, unless told)",
                                       .value = "FORMAT"},
                                      {{"text", ReportFormat::kText},
                                       {"json", ReportFormat::kJSON},
                                       {"sarif", ReportFormat::kSARIF},
                                       {"github", ReportFormat::kGitHub}},
                                      request.format);
  commandLine.AddFlag(
      {.names = "--no-snippet", .text = "Leave out the lines that findings are about"},
      request.noSnippet);
  AddColourOption(commandLine, request.colour);
  commandLine.AddFlag({.names = "-q", .text = "Leave out the counts"}, request.quiet);
  commandLine.AddFlag({.names = "--list-rules", .text = "Print all rules and exit"},
                      request.listRules);
}

void RequireRules(const std::vector<std::string>& names) {
  for (const std::string& name : names) {
    if (FindRule(name) == nullptr) {
      throw UsageError(fmt::format("unknown rule '{}'", Printable(name)));
    }
  }
}

void RequireFiles(const Request& request) {
  CheckFiles(request.files);
  std::vector<std::string> all = request.files;
  for (const auto& more : {request.reference, request.baseline}) {
    if (more) all.push_back(*more);
  }
  CheckFiles(all);
}

void ListRules() {
  size_t width = 0;
  for (const Rule* const rule : Rules()) width = std::max(width, rule->name.size());
  for (const Rule* const rule : Rules()) {
    WriteOutput(fmt::format("{:<{}}  {:<7}  {}\n", rule->name, width, SeverityName(rule->severity),
                            rule->summary));
  }
}

// None, and a word of it in the report, where the file cannot be read.
std::optional<ImageFile> Read(const std::string& name, FileEncoding encoding, Report& report) {
  try {
    return ReadImageFile(name, encoding);
  } catch (const Failure& failure) {
    report.unreadFiles.push_back({name, failure.what()});
  } catch (const std::bad_alloc&) {
    report.unreadFiles.push_back({name, fmt::format("{}: out of memory", Printable(name))});
  }
  Say(report.unreadFiles.back().message);
  return {};
}

class Filter {
 public:
  explicit Filter(const Request& request)
      : disabled(request.disabledRules),
        least(request.info ? Severity::kInfo : std::min(request.failOn, Severity::kWarning)) {
    if (request.baseline) known = ReadBaseline(*request.baseline);
  }

  bool Passes(const ReportedFinding& reported) const {
    const Rule& rule = *reported.finding.rule;
    return rule.severity >= least && !known.contains(reported.fingerprint) &&
           std::ranges::find(disabled, rule.name) == disabled.end();
  }

 private:
  const std::vector<std::string>& disabled;
  Severity least;
  std::unordered_set<std::string> known;
};

std::vector<ReportedFinding> Passing(std::vector<Finding> findings, const Filter& filter) {
  std::vector<std::string> fingerprints = Fingerprints(findings);
  std::vector<ReportedFinding> passing;
  for (size_t i = 0; i < findings.size(); ++i) {
    ReportedFinding reported = {std::move(findings[i]), std::move(fingerprints[i])};
    if (filter.Passes(reported)) passing.push_back(std::move(reported));
  }
  return passing;
}

Report Checked(const Request& request) {
  const Filter filter(request);
  Report report;
  std::vector<ImageFile> files;
  for (const std::string& name : request.files) {
    std::optional<ImageFile> file = Read(name, request.encoding, report);
    if (!file) continue;
    report.files.push_back(name);
    files.push_back(std::move(*file));
  }
  std::optional<ImageFile> reference;
  if (request.reference) reference = Read(*request.reference, request.encoding, report);
  report.findings = Passing(
      CheckDictionaries(files, reference ? &*reference : nullptr, request.encoding), filter);
  return report;
}

void Write(const Report& report, const Request& request) {
  switch (request.format) {
    case ReportFormat::kText:
      return WriteTextReport(report, {!request.noSnippet, WantsColour(request.colour)});
    case ReportFormat::kJSON:
      return WriteJSONReport(report);
    case ReportFormat::kSARIF:
      return WriteSARIFReport(report);
    case ReportFormat::kGitHub:
      return WriteGitHubReport(report);
  }
}

size_t CountAtLeast(const Report& report, Severity least) {
  return static_cast<size_t>(std::ranges::count_if(
      report.findings,
      [&](const ReportedFinding& reported) { return reported.finding.rule->severity >= least; }));
}

std::string Counted(size_t count, std::string_view what) {
  return fmt::format("{} {}{}", count, what, count == 1 ? "" : "s");
}

// "2 errors, 1 warning in 3 files"
std::string CountsText(const Report& report) {
  const size_t errors = CountAtLeast(report, Severity::kError);
  const size_t warnings = CountAtLeast(report, Severity::kWarning) - errors;
  const size_t infos = report.findings.size() - errors - warnings;
  std::string text = Counted(errors, "error") + ", " + Counted(warnings, "warning");
  if (infos != 0) text += fmt::format(", {} info", infos);
  return text + " in " + Counted(report.files.size(), "file");
}

ExitStatus Check(const Request& request) {
  const Report report = Checked(request);
  Write(report, request);
  FlushOutput();
  if (!request.quiet) Say(CountsText(report));
  if (!report.unreadFiles.empty()) return ExitStatus::kNotDone;
  return CountAtLeast(report, request.failOn) == 0 ? ExitStatus::kDone : ExitStatus::kFindings;
}

}  // namespace

ExitStatus RunCheck(int argc, const char* const* argv) {
  Request request;
  CommandLine commandLine("kolvane check", "FILE...", kAbout);
  AddDictionaryOptions(commandLine, request);
  AddFindingOptions(commandLine, request);
  AddReportOptions(commandLine, request);
  request.files = commandLine.Parse(argc, argv);
  RequireRules(request.disabledRules);
  if (request.listRules) {
    ListRules();
    return ExitStatus::kDone;
  }
  RequireFiles(request);
  return Check(request);
}
