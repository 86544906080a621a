// What a check tells, in the forms that people and programs read.
#pragma once

#include <string>
#include <vector>

#include "tools/kolvane/lint/Finding.h"

struct ReportedFinding {
  Finding finding;
  std::string fingerprint;
};

struct UnreadFile {
  std::string file;     // as the user gave it
  std::string message;  // names the file and the reason
};

struct Report {
  std::vector<ReportedFinding> findings;
  std::vector<std::string> files;  // those that were checked
  std::vector<UnreadFile> unreadFiles;
};

struct TextStyle {
  bool snippets = true;
  bool colour = false;
};

// Each writes the whole report to standard output, in the order of its findings, and throws what
// WriteOutput throws. Control characters of names and messages are shown escaped; where a format
// has escapes of its own, keys keep them. The same report is the same text on every machine.

// A place, severity, message and rule for each finding, its notes, and the line that it is about.
// Files that were not read are none of its business.
void WriteTextReport(const Report& report, TextStyle style);

// One object, with `version` 1; what a finding does not have is left out of it.
void WriteJSONReport(const Report& report);

// SARIF 2.1.0.
void WriteSARIFReport(const Report& report);

// Workflow commands that GitHub shows beside the lines.
void WriteGitHubReport(const Report& report);
