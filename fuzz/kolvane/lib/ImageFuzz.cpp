// Any bytes as images, loaded one after another; the first one also as the default dictionary.
#include <algorithm>

#include "fuzz/Input.h"
#include "tests/kolvane/lib/SlowTwin.h"
#include "tests/kolvane/lib/Support.h"

namespace {

// The latest load added what it says to a table that held `before` entries.
void RequireCounts(const LoadStatus& status, size_t before, size_t after) {
  const bool isText = status.format == ImageFormat::kText;
  const size_t gone = isText ? status.entriesReplaced : 0;
  Require(after == before + status.entriesAdded - gone, "the load's counts are the table's");
  Require(status.entriesReplaced <= status.entriesAdded, "no more is replaced than added");
}

// Looks into every bucket after each load, or only after the last one.
void LoadBoth(DictionaryTable& table, SlowTwin& twin, const std::vector<std::string>& images) {
  DictionaryTable lazy;
  size_t before = 0;
  for (const std::string& image : images) {
    Load(table, image);
    Load(lazy, image);
    twin.Load(image);
    const Contents contents = ContentsOf(table);
    Require(contents == twin.AllContents(), "the table holds what its twin does");
    RequireCounts(table.LastLoad(), before, contents.size());
    before = contents.size();
  }
  Require(ContentsOf(lazy) == twin.AllContents(), "the table that waited holds it too");
  Require(lazy.LastLoad().damage == table.LastLoad().damage, "both tell of the same damage");
}

// Keys that are there, and whatever else the images hold, as far as its first zero.
std::vector<std::string> Questions(const SlowTwin& twin, const std::vector<std::string>& images) {
  constexpr size_t kMost = 16;
  std::vector<std::string> questions = {"$$$/a=b^n#{amp}"};
  for (const auto& [bucket, key, value] : twin.AllContents()) {
    if (questions.size() == kMost) break;
    questions.push_back("$$$" + key + "=default");
  }
  questions.insert(questions.end(), images.begin(), images.end());
  for (std::string& question : questions) question = question.c_str();
  return questions;
}

void RequireSameAnswers(DictionaryTable& table, const SlowTwin& twin, const SlowTwin* fallback,
                        const std::vector<std::string>& questions) {
  for (const std::string& question : questions) {
    Require(Translated(table, question.c_str()) == twin.Translate(question, fallback),
            "the table answers as its twin does");
  }
}

// The newest of a key comes out first; what lies in a wrong bucket stays.
void RequireAllComeOut(DictionaryTable& table, const SlowTwin& twin) {
  Contents others;
  for (const auto& entry : twin.AllContents()) {
    const auto& [bucket, key, value] = entry;
    if (bucket != BucketOf(key)) {
      others.push_back(entry);
      continue;
    }
    const auto detached = table.Detach(Key(key));
    Require(detached != nullptr && Text(detached->Value()) == value, "an entry comes out");
  }
  Require(ContentsOf(table) == others, "no entry is left that can be found");
}

}  // namespace

int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  std::vector<std::string> images = Pieces(data, size);
  DictionaryTable defaults, table;
  SlowTwin defaultTwin, twin;
  LoadBoth(defaults, defaultTwin, {images.front(), images.front()});
  std::rotate(images.begin(), images.begin() + 1, images.end());
  LoadBoth(table, twin, images);
  const auto questions = Questions(twin, images);
  RequireSameAnswers(table, twin, nullptr, questions);
  defaults.MakeDefault();
  RequireSameAnswers(table, twin, &defaultTwin, questions);
  RequireSameAnswers(table, twin, &defaultTwin, Questions(defaultTwin, images));
  RequireAllComeOut(table, twin);
  RequireAllComeOut(defaults, defaultTwin);
  return 0;
}
