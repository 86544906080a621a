#include <fmt/format.h>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/cli/StandardOutput.h"
#include "tools/kolvane/lint/report/PlaceText.h"
#include "tools/kolvane/lint/report/Reports.h"
#include "tools/kolvane/lint/report/Snippet.h"

namespace {

// As terminals take them: the numbers between "ESC [" and "m".
constexpr std::string_view kBold = "1";
constexpr std::string_view kNote = "1;36";
constexpr std::string_view kMark = "1;32";

std::string_view ColourOf(Severity severity) noexcept {
  switch (severity) {
    case Severity::kError:
      return "1;31";
    case Severity::kWarning:
      return "1;35";
    case Severity::kInfo:
      return "1;34";
  }
  return {};
}

class TextWriter {
 public:
  explicit TextWriter(TextStyle wanted) noexcept : style(wanted) {}

  void Write(const Finding& finding) const {
    const Severity severity = finding.rule->severity;
    WriteOutput(fmt::format("{} {} {} [{}]\n", Painted(PlaceText(finding.place) + ':', kBold),
                            Painted(fmt::format("{}:", SeverityName(severity)), ColourOf(severity)),
                            Printable(finding.message), finding.rule->name));
    for (const Note& note : finding.notes) Write(note);
    if (style.snippets && !finding.place.lineText.empty()) WriteSnippet(finding.place);
  }

 private:
  void Write(const Note& note) const {
    WriteOutput(fmt::format("{} {} {}\n", Painted(PlaceText(note.place) + ':', kBold),
                            Painted("note:", kNote), Printable(note.text)));
  }

  // Set in, so that no line of a dictionary passes for a finding.
  void WriteSnippet(const Place& place) const {
    const Snippet snippet = SnippetOf(place);
    WriteOutput(fmt::format("  {}\n  {}{}\n", snippet.line, snippet.indent, Painted("^", kMark)));
  }

  std::string Painted(std::string_view text, std::string_view colour) const {
    return style.colour ? fmt::format("\x1B[{}m{}\x1B[0m", colour, text) : std::string(text);
  }

  TextStyle style;
};

}  // namespace

void WriteTextReport(const Report& report, TextStyle style) {
  const TextWriter writer(style);
  for (const ReportedFinding& reported : report.findings) writer.Write(reported.finding);
}
