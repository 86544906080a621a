// What a check says of a dictionary.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

enum class Severity {
  kInfo,     // cosmetic; not shown unless asked for
  kWarning,  // misleads users
  kError     // can break the program, or loses text
};

// As reports and options name it.
std::string_view SeverityName(Severity severity) noexcept;

// One kind of finding. Its name is permanent: people silence findings by it.
struct Rule {
  std::string_view name;
  Severity severity;
  std::string_view summary;  // one line
};

// In a text dictionary a line and a column, in a binary one an entry and a byte offset, and neither
// for a file as a whole.
struct Place {
  std::string file{};  // as the user gave it
  size_t line = 0;     // from 1; 0 where the place is no line
  size_t column = 0;   // from 1, in code points; 0 with line 0
  size_t entry = 0;    // from 1; 0 where the place is no entry of a binary image
  bool hasOffset = false;
  uint64_t offset = 0;     // in bytes from the image's start
  std::string lineText{};  // the line in UTF-8 as it is, its end left out; may be left out
};

// Another place that has to do with a finding, and what is there. One place may be noted by very
// many findings, and so comes without the text of its line.
struct Note {
  Place place;
  std::string text;
};

Note NoteOf(const Place& place, std::string text);

// Texts are in UTF-8, lower case at their start, without a full stop, and may quote what the
// dictionary holds: control characters are still to be escaped.
struct Finding {
  const Rule* rule = nullptr;
  Place place{};
  std::string message{};
  std::string key{};  // the key that it is about, in UTF-8; empty where it is about none
  std::vector<Note> notes{};
};
