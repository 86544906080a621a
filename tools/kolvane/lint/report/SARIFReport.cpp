#include <fmt/format.h>

#include <algorithm>
#include <cctype>
#include <nlohmann/json.hpp>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/cli/JSON.h"
#include "tools/kolvane/lint/Rules.h"
#include "tools/kolvane/lint/report/PlaceText.h"
#include "tools/kolvane/lint/report/Reports.h"

namespace {

using JSON = nlohmann::ordered_json;

const char* LevelOf(Severity severity) noexcept {
  switch (severity) {
    case Severity::kError:
      return "error";
    case Severity::kWarning:
      return "warning";
    case Severity::kInfo:
      return "note";
  }
  return "none";
}

// Braces stand for arguments of a message unless they are doubled.
JSON MessageObject(std::string_view text) {
  std::string escaped;
  for (const char character : Printable(text)) {
    escaped += character;
    if (character == '{' || character == '}') escaped += character;
  }
  return {{"text", escaped}};
}

bool IsSpecial(char character) noexcept {
  return std::isalnum(static_cast<unsigned char>(character)) == 0 &&
         std::string_view("-._~/").find(character) == std::string_view::npos;
}

std::string EscapedName(std::string_view name) {
  return PercentEncoded(name, IsSpecial);
}

// A relative reference, or a URI where the file is named by its whole path.
std::string URIOf(const std::string& file) {
  const std::string name = PortableName(file);
  const bool hasDrive = kHasDrives && name.size() > 2 && name[1] == ':';
  if (hasDrive) return fmt::format("file:///{}:{}", name.front(), EscapedName(name.substr(2)));
  return (name.starts_with('/') ? "file://" : "") + EscapedName(name);
}

// Who shows results demands all three texts.
JSON RuleObject(const Rule& rule) {
  const JSON summary = MessageObject(rule.summary);
  return {{"id", rule.name},
          {"shortDescription", summary},
          {"fullDescription", summary},
          {"help", summary},
          {"defaultConfiguration", {{"level", LevelOf(rule.severity)}}}};
}

JSON RegionObject(const Place& place) {
  if (place.line != 0) return {{"startLine", place.line}, {"startColumn", place.column}};
  return {{"byteOffset", place.offset}, {"byteLength", 0}};
}

JSON LocationObject(const Place& place) {
  JSON physical = {{"artifactLocation", {{"uri", URIOf(place.file)}}}};
  if (place.line != 0 || place.hasOffset) physical["region"] = RegionObject(place);
  return {{"physicalLocation", std::move(physical)}};
}

JSON MainLocationObject(const Finding& finding) {
  JSON location = LocationObject(finding.place);
  if (!finding.key.empty()) {
    const JSON key = {{"fullyQualifiedName", finding.key}, {"kind", "resource"}};
    location["logicalLocations"] = JSON::array({key});
  }
  return location;
}

JSON RelatedLocations(const Finding& finding) {
  JSON locations = JSON::array();
  for (const Note& note : finding.notes) {
    locations.push_back(LocationObject(note.place));
    locations.back()["message"] = MessageObject(note.text);
  }
  return locations;
}

size_t IndexOf(const Rule& rule) {
  return static_cast<size_t>(std::ranges::find(Rules(), &rule) - Rules().begin());
}

JSON ResultObject(const ReportedFinding& reported) {
  const Finding& finding = reported.finding;
  JSON result = {{"ruleId", finding.rule->name},
                 {"ruleIndex", IndexOf(*finding.rule)},
                 {"level", LevelOf(finding.rule->severity)},
                 {"message", MessageObject(finding.message)},
                 {"locations", JSON::array({MainLocationObject(finding)})}};
  if (!finding.notes.empty()) result["relatedLocations"] = RelatedLocations(finding);
  result["partialFingerprints"] = {{"ruleKeyFile/v1", reported.fingerprint}};
  return result;
}

JSON NotificationObject(const UnreadFile& unread) {
  Place place;
  place.file = unread.file;
  return {{"level", "error"},
          {"message", MessageObject(unread.message)},
          {"locations", JSON::array({LocationObject(place)})}};
}

template <class Items, class Convert>
JSON ArrayOf(const Items& items, Convert convert) {
  JSON array = JSON::array();
  for (const auto& item : items) array.push_back(convert(item));
  return array;
}

JSON ToolObject() {
  const auto ruleObject = [](const Rule* rule) { return RuleObject(*rule); };
  return {{"driver",
           {{"name", "kolvane"},
            {"version", KOLVANE_VERSION},
            {"rules", ArrayOf(Rules(), ruleObject)}}}};
}

JSON RunObject(const Report& report) {
  const auto artifactObject = [](const std::string& file) -> JSON {
    return {{"location", {{"uri", URIOf(file)}}}};
  };
  JSON invocation = {
      {"executionSuccessful", report.unreadFiles.empty()},
      {"toolExecutionNotifications", ArrayOf(report.unreadFiles, NotificationObject)}};
  return {{"tool", ToolObject()},
          {"columnKind", "unicodeCodePoints"},
          {"newlineSequences", {"\r\n", "\n", "\r", "\u2028", "\u2029"}},
          {"invocations", JSON::array({std::move(invocation)})},
          {"artifacts", ArrayOf(report.files, artifactObject)},
          {"results", ArrayOf(report.findings, ResultObject)}};
}

}  // namespace

void WriteSARIFReport(const Report& report) {
  WriteJSON({{"$schema", "https://json.schemastore.org/sarif-2.1.0.json"},
             {"version", "2.1.0"},
             {"runs", JSON::array({RunObject(report)})}});
}
