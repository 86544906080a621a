// JSON on standard output.
#pragma once

#include <nlohmann/json.hpp>

// The version that a report in JSON gives of itself. It changes when something that a program may
// rely on goes or changes its meaning.
inline constexpr int kJSONReportVersion = 1;

// In UTF-8, with a line end after it; names of files that are no UTF-8 are repaired. Throws what
// WriteOutput throws.
void WriteJSON(const nlohmann::ordered_json& value);
