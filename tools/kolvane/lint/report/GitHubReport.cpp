#include <fmt/format.h>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/cli/StandardOutput.h"
#include "tools/kolvane/lint/report/PlaceText.h"
#include "tools/kolvane/lint/report/Reports.h"

namespace {

const char* CommandOf(Severity severity) noexcept {
  switch (severity) {
    case Severity::kError:
      return "error";
    case Severity::kWarning:
      return "warning";
    case Severity::kInfo:
      return "notice";
  }
  return "notice";
}

std::string EscapedMessage(std::string_view text) {
  return PercentEncoded(text,
                        [](char each) { return each == '%' || each == '\r' || each == '\n'; });
}

std::string EscapedProperty(std::string_view text) {
  return PercentEncoded(text, [](char each) {
    return each == '%' || each == '\r' || each == '\n' || each == ':' || each == ',';
  });
}

// A place in a binary image has no property, and stands in the message.
std::string MessageOf(const Finding& finding) {
  const std::string position = BinaryPosition(finding.place);
  std::string message = (position.empty() ? "" : position + ": ") + Printable(finding.message);
  for (const Note& note : finding.notes) {
    message += fmt::format("\n{}: note: {}", PlaceText(note.place), Printable(note.text));
  }
  return message;
}

std::string CommandText(const Finding& finding) {
  const Place& place = finding.place;
  const std::string position =
      place.line == 0 ? "" : fmt::format(",line={},col={}", place.line, place.column);
  return fmt::format("::{} file={}{},title={}::{}\n", CommandOf(finding.rule->severity),
                     EscapedProperty(PortableName(place.file)), position, finding.rule->name,
                     EscapedMessage(MessageOf(finding)));
}

}  // namespace

void WriteGitHubReport(const Report& report) {
  for (const ReportedFinding& reported : report.findings) {
    WriteOutput(CommandText(reported.finding));
  }
  for (const UnreadFile& unread : report.unreadFiles) {
    WriteOutput(fmt::format("::error file={}::{}\n", EscapedProperty(PortableName(unread.file)),
                            EscapedMessage(unread.message)));
  }
}
