#include "tools/kolvane/cli/JSON.h"
#include "tools/kolvane/stats/StatisticsReport.h"

namespace {

using Object = nlohmann::ordered_json;

Object ObjectOf(const Coverage& coverage) {
  Object object;
  object["translated"] = coverage.translated;
  object["identical"] = coverage.identical;
  object["missing"] = coverage.missing;
  object["extra"] = coverage.extra;
  object["translatedPercent"] = TranslatedPercent(coverage);
  return object;
}

Object ObjectOf(const FileStatistics& file) {
  Object object;
  object["file"] = file.name;
  object["keys"] = file.statistics.keys;
  object["words"] = file.statistics.words;
  if (file.coverage) object.update(ObjectOf(*file.coverage));
  object["usedBuckets"] = file.statistics.usedBuckets;
  object["longestChain"] = file.statistics.longestChain;
  object["meanSteps"] = file.statistics.meanSteps;
  return object;
}

}  // namespace

void WriteJSONReport(const StatisticsReport& report) {
  Object object;
  object["version"] = kJSONReportVersion;
  object["buckets"] = DictionaryTable::kBucketCount;
  if (report.reference) {
    object["reference"]["file"] = report.reference->name;
    object["reference"]["keys"] = report.reference->keys;
  }
  object["files"] = Object::array();
  for (const FileStatistics& file : report.files) object["files"].push_back(ObjectOf(file));
  WriteJSON(object);
}
