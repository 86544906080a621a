// Any bytes as the files of `kolvane check`, `stats` and `dump`, with and without a reference.
#include <algorithm>
#include <array>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <sstream>

#include "Comparison.h"
#include "DictionaryCheck.h"
#include "DictionaryFile.h"
#include "DictionaryWriter.h"
#include "Fingerprints.h"
#include "Input.h"
#include "LoadWarnings.h"
#include "Reports.h"
#include "Rules.h"
#include "StandardOutput.h"
#include "StatisticsReport.h"
#include "Text.h"
#include "Words.h"

namespace {

using Findings = std::vector<Finding>;
using Entries = std::vector<const tovali_private::DictionaryEntry*>;

void DiscardOutput() {
  const char* const nowhere =
      std::filesystem::path::preferred_separator == '/' ? "/dev/null" : "NUL";
  Require(std::freopen(nowhere, "w", stdout) != nullptr, "output can be discarded");
  std::setvbuf(stdout, nullptr, _IOFBF, 1 << 16);
}

// As the command reads it.
ImageFile AsFile(const std::string& bytes, const std::string& name, FileEncoding encoding) {
  static const auto path = std::filesystem::temp_directory_path() /
                           ("kolvane-fuzz-" + std::to_string(std::random_device()()));
  std::ofstream(path, std::ios::binary) << bytes;
  ImageFile file = ReadImageFile(path.string(), encoding);
  std::filesystem::remove(path);
  file.name = name;
  return file;
}

bool Has(const Findings& findings, const Rule& rule) {
  return std::ranges::any_of(findings, [&](const Finding& each) { return each.rule == &rule; });
}

size_t Count(const Findings& findings, const Rule& rule) {
  return static_cast<size_t>(std::ranges::count(findings, &rule, &Finding::rule));
}

void RequireWellFormed(const Findings& findings) {
  for (const Finding& finding : findings) {
    Require(finding.rule != nullptr && !finding.message.empty(), "a finding says something");
    Require(IsValidUTF8(finding.message) && IsValidUTF8(finding.key), "and says it in UTF-8");
    Require(IsValidUTF8(finding.place.lineText), "so is its line");
    Require((finding.place.line == 0) == (finding.place.column == 0), "a line has a column");
  }
}

void WriteReports(const Findings& findings, const std::vector<ImageFile>& files) {
  Report report;
  std::vector<std::string> fingerprints = Fingerprints(findings);
  for (size_t i = 0; i < findings.size(); ++i) {
    report.findings.push_back({findings[i], fingerprints[i]});
  }
  for (const ImageFile& file : files) report.files.push_back(file.name);
  WriteTextReport(report, {.snippets = true, .colour = true});
  WriteTextReport(report, {.snippets = false, .colour = false});
  WriteJSONReport(report);
  WriteGitHubReport(report);
  if (findings.size() % 4 == 1) WriteSARIFReport(report);  // its rules take half of the time
}

// A dictionary as the command knows it. What a check finds of it alone tells whether the check
// looks at the lines that a translator takes.
struct Dictionary {
  Dictionary(const ImageFile& image, FileEncoding encoding)
      : findings(CheckDictionaries({image}, nullptr, encoding)) {
    for (const std::string& warning : WarningsOf(image, LoadInto(table, image))) {
      Require(IsValidUTF8(warning), "warnings are UTF-8");
    }
    entries = EntriesInFileOrder(table, image);
    Entries found = tovali_private::FoundEntries(table), sorted = entries;
    Require(sorted.size() == found.size(), "each entry that is found is in the file once");
    std::ranges::sort(found);
    std::ranges::sort(sorted);
    Require(sorted == found, "a file has the entries that are found");
  }

  bool IsChecked() const {
    return !Has(findings, rules::kTooShort) && !Has(findings, rules::kUTF16WithoutMark);
  }

  Findings findings;
  DictionaryTable table;
  Entries entries;
};

// The entries whose keys the other table lacks. A byte-order mark on a line of its own is a key,
// but none that a check would speak of.
size_t CountLacking(const Entries& entries, DictionaryTable& other) {
  return static_cast<size_t>(std::ranges::count_if(entries, [&](const auto* entry) {
    const bool isMark = AsText(entry->Bytes()) == "\xFF" && entry->Value().Length() == 0;
    return !isMark && other.Find(*entry) == nullptr;
  }));
}

// What the check of a translation says of its keys, against the tables that translators have.
void CheckKeys(Dictionary& translation, Dictionary& reference, const Findings& findings) {
  if (!translation.IsChecked() || !reference.IsChecked()) return;
  Require(Count(findings, rules::kExtraKey) == CountLacking(translation.entries, reference.table),
          "the check knows the keys that are extra");
  Require(Count(findings, rules::kMissingKey) == CountLacking(reference.entries, translation.table),
          "the check knows the keys that are missing");
}

// As an image from which a check takes the same definitions, to find its values all the same.
void CheckValues(const ImageFile& file, Dictionary& dictionary, FileEncoding encoding) {
  using namespace tovali_private;
  if (!dictionary.IsChecked()) return;
  std::ostringstream image;
  const auto lost =
      WriteBinary(dictionary.table, BinaryVersion::k1_5, TextEncoding::kUTF16LE, image);
  Require(lost.empty(), "UTF-16 carries everything");
  const ImageFile written = {"written", image.str(), {}};
  const Findings findings = CheckDictionaries({file}, &written, encoding);
  Require(Count(findings, rules::kExtraKey) == 0, "what is written has every key");
  const Coverage coverage = CoverageOf(dictionary.table, dictionary.table);
  Require(Count(findings, rules::kUntranslated) == coverage.identical,
          "the check knows the values that translators have");
}

void CheckNumbers(Dictionary& translation, Dictionary& reference) {
  StatisticsReport report;
  const Statistics statistics = StatisticsOf(reference.table);
  Require(statistics.keys == reference.entries.size(), "statistics count what is found");
  report.reference = {"reference", statistics.keys};
  const Coverage coverage = CoverageOf(translation.table, reference.table);
  Require(coverage.ReferenceKeys() == statistics.keys, "each key of a reference counts once");
  if (statistics.keys == 0) report.reference.reset();
  const auto counted = report.reference ? std::optional(coverage) : std::nullopt;
  report.files.push_back({"translation", StatisticsOf(translation.table), counted});
  WriteTextReport(report);
  WriteJSONReport(report);
  WriteCSVReport(report);
  WriteHTMLReport(report);
}

void CompareAll(Dictionary& translation, Dictionary& reference) {
  for (const auto* entry : translation.entries) {
    const auto text = entry->Value().Units();
    Require(CountWords(text) <= text.size(), "words are not empty");
    if (const auto* const other = reference.table.Find(*entry)) {
      Compare(other->Value().Units(), text);
    }
  }
}

}  // namespace

// The first byte picks the encoding; then come one, two or three files, of which the first is a
// reference to the others, if there are others.
int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const bool discarded = (DiscardOutput(), true);
  if (size == 0 || !discarded) return 0;
  constexpr std::array kEncodings = {FileEncoding::kAuto, FileEncoding::kImage,
                                     FileEncoding::kUTF8};
  const FileEncoding encoding = kEncodings[data[0] % kEncodings.size()];
  std::vector<ImageFile> files;
  for (const std::string& bytes : Pieces(data + 1, size - 1)) {
    files.push_back(AsFile(bytes, "file" + std::to_string(files.size()), encoding));
  }
  const std::vector<ImageFile> others(files.begin() + 1, files.end());
  RequireWellFormed(CheckDictionaries(others, nullptr, encoding));
  const Findings findings = CheckDictionaries(others, &files.front(), encoding);
  RequireWellFormed(findings);
  WriteReports(findings, others);
  Dictionary reference(files.front(), encoding), translation(files.back(), encoding);
  CheckKeys(translation, reference, CheckDictionaries({files.back()}, &files.front(), encoding));
  CheckValues(files.back(), translation, encoding);
  CheckNumbers(translation, reference);
  CompareAll(translation, reference);
  return 0;
}
