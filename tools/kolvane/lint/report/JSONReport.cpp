#include <nlohmann/json.hpp>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/cli/JSON.h"
#include "tools/kolvane/lint/report/Reports.h"

namespace {

using JSON = nlohmann::ordered_json;

JSON PlaceObject(const Place& place) {
  JSON object = {{"file", place.file}};
  if (place.line != 0) {
    object["line"] = place.line;
    object["column"] = place.column;
  }
  if (place.entry != 0) object["entry"] = place.entry;
  if (place.hasOffset) object["offset"] = place.offset;
  return object;
}

JSON NoteObject(const Note& note) {
  JSON object = PlaceObject(note.place);
  object["message"] = Printable(note.text);
  return object;
}

JSON FindingObject(const ReportedFinding& reported) {
  const Finding& finding = reported.finding;
  JSON object = PlaceObject(finding.place);
  object["severity"] = SeverityName(finding.rule->severity);
  object["rule"] = finding.rule->name;
  object["message"] = Printable(finding.message);
  if (!finding.key.empty()) object["key"] = finding.key;
  object["notes"] = JSON::array();
  for (const Note& note : finding.notes) object["notes"].push_back(NoteObject(note));
  object["fingerprint"] = reported.fingerprint;
  return object;
}

}  // namespace

void WriteJSONReport(const Report& report) {
  JSON findings = JSON::array();
  for (const ReportedFinding& reported : report.findings) {
    findings.push_back(FindingObject(reported));
  }
  JSON unread = JSON::array();
  for (const UnreadFile& file : report.unreadFiles) {
    unread.push_back({{"file", file.file}, {"message", file.message}});
  }
  WriteJSON({{"version", kJSONReportVersion},
             {"files", report.files},
             {"unreadFiles", std::move(unread)},
             {"findings", std::move(findings)}});
}
