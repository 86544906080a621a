#include "tools/kolvane/lint/report/Baseline.h"

#include <fmt/format.h>

#include <nlohmann/json.hpp>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/cli/JSON.h"
#include "tools/kolvane/dictionary/ImageFile.h"

std::unordered_set<std::string> ReadBaseline(const std::string& name) {
  const ImageFile file = ReadImageFile(name, FileEncoding::kImage);
  try {
    const nlohmann::json report = nlohmann::json::parse(file.bytes);
    if (report.at("version") != kJSONReportVersion) {
      throw Failure(fmt::format("{}: is a report of another version", Printable(name)));
    }
    std::unordered_set<std::string> fingerprints;
    for (const nlohmann::json& finding : report.at("findings")) {
      fingerprints.insert(finding.at("fingerprint").get<std::string>());
    }
    return fingerprints;
  } catch (const nlohmann::json::exception&) {
    throw Failure(fmt::format("{}: is no report in JSON of a check", Printable(name)));
  }
}
