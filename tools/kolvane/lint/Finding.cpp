#include "tools/kolvane/lint/Finding.h"

#include <utility>

std::string_view SeverityName(Severity severity) noexcept {
  switch (severity) {
    case Severity::kInfo:
      return "info";
    case Severity::kWarning:
      return "warning";
    case Severity::kError:
      return "error";
  }
  return {};
}

Note NoteOf(const Place& place, std::string text) {
  return {{.file = place.file,
           .line = place.line,
           .column = place.column,
           .entry = place.entry,
           .hasOffset = place.hasOffset,
           .offset = place.offset},
          std::move(text)};
}
