// What `kolvane check` and `stats` tell of any bytes.
#include <algorithm>
#include <nlohmann/json.hpp>
#include <sstream>

#include "fuzz/Input.h"
#include "fuzz/tools/kolvane/CommandTrial.h"
#include "kolvane/lib/DictionaryWriter.h"
#include "tools/kolvane/lint/Rules.h"
#include "tools/kolvane/stats/Statistics.h"
#include "tools/kolvane/text/UTF8.h"

namespace {

using JSON = nlohmann::json;

size_t CountLines(std::string_view text) {
  return static_cast<size_t>(std::ranges::count(text, '\n'));
}

// What a report says of a file.
size_t Count(const JSON& report, const std::string& file, const Rule& rule) {
  return static_cast<size_t>(std::ranges::count_if(report["findings"], [&](const JSON& finding) {
    return finding["file"] == file && finding["rule"] == rule.name;
  }));
}

// Whether the check looks at the lines that a translator takes.
bool IsChecked(const JSON& report, const std::string& file) {
  return std::ranges::none_of(report["findings"], [&](const JSON& finding) {
    const bool isMalformed =
        finding["rule"] == rules::kMalformedInput.name && !finding.contains("line");
    return finding["file"] == file && (isMalformed || finding["rule"] == rules::kTooShort.name ||
                                       finding["rule"] == rules::kNoDictionary.name ||
                                       finding["rule"] == rules::kUTF16WithoutMark.name);
  });
}

void RequireWellFormed(const JSON& report) {
  for (const JSON& finding : report["findings"]) {
    const Rule* const rule = FindRule(finding["rule"].get<std::string>());
    Require(rule != nullptr && finding["severity"] == SeverityName(rule->severity), "a rule");
    Require(finding["message"] != "", "a finding says something");
    Require(finding.contains("line") == finding.contains("column"), "a line has a column");
    Require(finding.value("line", 1) > 0 && finding.value("column", 1) > 0, "both begin at 1");
  }
}

JSON ReportOf(const Trial& trial, const Words& words) {
  const CommandRun run = trial.Run(words + Words{"--format=json"});
  const JSON report = JSON::parse(run.output);
  RequireWellFormed(report);
  const bool fails = std::ranges::any_of(
      report["findings"], [](const JSON& finding) { return finding["severity"] == "error"; });
  const ExitStatus expected = fails ? ExitStatus::kFindings : ExitStatus::kDone;
  Require(run.status == expected, "a check fails for an error");
  return report;
}

// Whether a console takes it as it is.
bool IsPlain(std::string text) {
  std::erase_if(text, [](char character) { return character == '\n' || character == '\t'; });
  return IsValidUTF8(text) && Printable(text) == text;
}

// The rules of a log in SARIF take so long that few inputs have one.
void CheckForms(Trial& trial, const Words& words, const JSON& report) {
  const size_t count = report["findings"].size();
  if (trial.choices.OneIn(16)) {
    const JSON log = JSON::parse(trial.Run(words + Words{"--format=sarif"}).output);
    Require(log["runs"][0]["results"].size() == count, "SARIF has each finding");
    return;
  }
  const bool isText = trial.choices.OneIn(2);
  const std::string form =
      trial.Run(words + Words{isText ? "--color=never" : "--format=github"}).output;
  Require(IsPlain(form), "a form is text without controls");
  const size_t lines = CountLines(form);
  Require(isText ? lines >= count : lines == count, "a form has each finding");
}

// Whether so many findings tell of the keys that the other table lacks. A byte-order mark on a line
// of its own is such a key, too, but none that a check would speak of.
bool TellsWhatIsLacking(size_t findings, const Answers& answers, const Answers& others) {
  const auto lacking = static_cast<size_t>(std::ranges::count_if(
      answers, [&](const auto& answer) { return !others.contains(answer.first); }));
  const auto mark = answers.find("\xFF");
  const bool mayBeMark =
      mark != answers.end() && mark->second.empty() && !others.contains(mark->first);
  return findings == lacking || (mayBeMark && findings + 1 == lacking);
}

// What a check says of keys, against those that translators find.
void CheckKeys(const Trial& trial, const JSON& report) {
  const std::string &reference = trial.files.front(), &file = trial.files.back();
  if (!IsChecked(report, reference) || !IsChecked(report, file)) return;
  const Answers expected = Loaded({reference}, trial.encoding).answers;
  const Answers answers = Loaded({file}, trial.encoding).answers;
  Require(TellsWhatIsLacking(Count(report, file, rules::kExtraKey), answers, expected),
          "the check knows the keys that are extra");
  Require(TellsWhatIsLacking(Count(report, file, rules::kMissingKey), expected, answers),
          "the check knows the keys that are missing");
}

// As an image from which a check takes the same definitions, to find its values all the same.
void CheckValues(const Trial& trial, const JSON& report) {
  using namespace tovali_private;
  const std::string& file = trial.files.back();
  if (!IsChecked(report, file)) return;
  Loaded loaded({file}, trial.encoding);
  std::ostringstream image;
  const auto lost = WriteBinary(loaded.table, BinaryVersion::k1_5, TextEncoding::kUTF16LE, image);
  Require(lost.empty(), "UTF-16 carries everything");
  const std::string written = trial.Write("written", image.view());
  const JSON compared = ReportOf(trial, {"check", "--info", "--reference", written, file});
  Require(Count(compared, file, rules::kExtraKey) == 0, "what is written has every key");
  Require(Count(compared, file, rules::kUntranslated) ==
              CoverageOf(loaded.table, loaded.table).identical,
          "the check knows the values that translators have");
}

void CheckStatsForms(Trial& trial, const Words& words) {
  const std::string format = trial.Pick({"text", "csv", "html"});
  const std::string output = trial.Run(words + Words{"--format", format}).output;
  Require(IsValidUTF8(output) && output.ends_with('\n'), "a report is text");
  Require(format != "html" || output.find(", &amp;0") != output.npos, "names stand in pages");
  Require(format != "html" || output.find(", &0") == output.npos, "as texts");
  const size_t files = trial.files.size() > 1 ? trial.files.size() - 1 : 1;
  Require(format != "csv" || CountLines(output) == 1 + files, "each file has a row");
}

void CheckCounts(const JSON& counts, const Answers& answers, const Answers* reference) {
  size_t units = 0;
  for (const auto& [key, value] : answers) units += value.size();
  Require(counts["keys"] == answers.size(), "statistics count what is found");
  Require(counts["words"] <= units, "words are not empty");
  if (reference == nullptr) return;
  size_t all = 0;
  for (const char* name : {"translated", "identical", "missing"}) all += counts[name].get<size_t>();
  Require(all == reference->size(), "each key of a reference counts once");
}

}  // namespace

// With more than one file, the first is a reference to the others.
void TryCheck(Trial& trial) {
  Words words = {"check", "--info"};
  const bool hasReference = trial.files.size() > 1;
  if (hasReference) words.push_back("--reference");
  words = words + trial.files;
  const JSON report = ReportOf(trial, words);
  CheckForms(trial, words, report);
  const Words baseline = {"--baseline", trial.Write("report", report.dump())};
  const CommandRun run = trial.Run(words + baseline);
  Require(run.status == ExitStatus::kDone && run.output.empty(), "a baseline leaves nothing");
  if (hasReference) CheckKeys(trial, report);
  CheckValues(trial, report);
}

// Of more than one file, the first is a reference to the others, here too.
void TryStats(Trial& trial) {
  const bool hasReference = trial.files.size() > 1;
  const Words words = (hasReference ? Words{"stats", "--reference"} : Words{"stats"}) + trial.files;
  const CommandRun run = trial.Run(words + Words{"--format=json"});
  const Loaded first({trial.files.front()}, trial.encoding);
  const Answers& reference = first.answers;
  if (hasReference && (reference.empty() || !first.areDictionaries)) {
    Require(run.status == ExitStatus::kNotDone && run.output.empty(), "nothing to compare with");
    return;
  }
  const Loaded all(trial.files, trial.encoding);
  Require((run.status == ExitStatus::kDone) == all.isWhole, "the status tells of damage");
  Require((run.status == ExitStatus::kNotDone) == !all.areDictionaries, "and of no dictionary");
  if (!all.areDictionaries) return;
  const JSON report = JSON::parse(run.output);
  Require(report["files"].size() == trial.files.size() - (hasReference ? 1 : 0),
          "each file but the reference is counted");
  for (const JSON& counts : report["files"]) {
    CheckCounts(counts, Loaded({counts["file"]}, trial.encoding).answers,
                hasReference ? &reference : nullptr);
  }
  CheckStatsForms(trial, words);
}
