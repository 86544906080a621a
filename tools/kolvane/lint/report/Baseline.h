// Findings that a project has made its peace with.
#pragma once

#include <string>
#include <unordered_set>

// The fingerprints of the findings in the file, which is a report in JSON of an earlier check.
// Throws Failure for a file that cannot be read, and for one that is no such report.
std::unordered_set<std::string> ReadBaseline(const std::string& name);
