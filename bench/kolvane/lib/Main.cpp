// dictionary-bench: measures lookups and loads of Kolvane and comparable libraries.
#include <fmt/format.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <boost/json/src.hpp>
#include <cstdio>
#include <filesystem>
#include <fstream>

#include "bench/kolvane/lib/KeySet.h"
#include "bench/kolvane/lib/Measures.h"
#include "bench/kolvane/lib/Subjects.h"
#include "bench/kolvane/lib/Subprocess.h"

namespace {

namespace json = boost::json;
namespace fs = std::filesystem;

#ifdef __clang__
constexpr char kCompiler[] = "Clang " __clang_version__;
#else
constexpr char kCompiler[] = "GCC " __VERSION__;
#endif

std::vector<std::string> SubjectNames() {
  std::vector<std::string> names;
  for (const SubjectKind& kind : SubjectKinds()) names.push_back(kind.name);
  return names;
}

struct Options {
  std::vector<std::string> sets = KeySetNames();
  std::vector<size_t> sizes = {1'000, 10'000, 100'000, 1'000'000};
  std::vector<std::string> subjects = SubjectNames();
  std::vector<std::string> measures = MeasureNames();
  int rounds = 7;
  std::string out;
};

bool Contains(const std::vector<std::string>& names, const std::string& name) {
  return std::find(names.begin(), names.end(), name) != names.end();
}

// A temporary folder for the files that the subjects load.
class Folder {
 public:
  Folder() {
    std::string pattern = fs::temp_directory_path() / "dictionary-bench-XXXXXX";
    if (mkdtemp(pattern.data()) == nullptr) throw std::runtime_error("no temporary folder");
    path = pattern;
  }
  Folder(const Folder&) = delete;
  Folder& operator=(const Folder&) = delete;
  ~Folder() {
    std::error_code ignored;
    fs::remove_all(path, ignored);
  }

  fs::path path;
};

std::vector<std::unique_ptr<Subject>> MakeSubjects(const Options& options, const KeySet& set,
                                                   const fs::path& folder, json::object& leftOut) {
  std::vector<std::unique_ptr<Subject>> subjects;
  for (const SubjectKind& kind : SubjectKinds()) {
    if (!Contains(options.subjects, kind.name)) continue;
    try {
      if (auto subject = kind.make(set, folder)) subjects.push_back(std::move(subject));
    } catch (const LeftOut& reason) {
      leftOut[kind.name] = reason.what();
    }
  }
  return subjects;
}

json::object MeasureSet(const Options& options, const std::string& name, size_t size) {
  const KeySet set = MakeKeySet(name, size);
  if (set.Size() == 0) return {};
  const Folder folder;
  json::object leftOut;
  auto subjects = MakeSubjects(options, set, folder.path, leftOut);
  Measures measures(set, subjects, options.rounds);
  measures.CheckAnswers();
  Results results;
  // Lookups come last, because some subjects cache every answer.
  for (const char* measure : {"first-use", "load", "miss", "hit"}) {
    if (Contains(options.measures, measure)) measures.Run(measure, results);
  }
  return {{"set", set.name},
          {"size", set.Size()},
          {"keyBytes", set.keys.Block().size()},
          {"valueUnits", set.values.Block().size()},
          {"leftOut", leftOut},
          {"results", results.Records()}};
}

// Prints a line for each subject and a column for each measure.
void Print(const json::object& measured) {
  fmt::print("\n{:18}", fmt::format("{} {}", measured.at("set").as_string().c_str(),
                                    measured.at("size").to_number<size_t>()));
  for (const std::string& column : ResultNames()) fmt::print("{:>15}", column);
  for (const auto& [subject, measures] : measured.at("results").as_object()) {
    fmt::print("\n{:18}", std::string_view(subject));
    for (const std::string& column : ResultNames()) {
      const json::value* const cell = measures.as_object().if_contains(column);
      fmt::print("{:>15}",
                 cell == nullptr ? "-" : fmt::format("{:.2f}", cell->at("least").as_double()));
    }
  }
  for (const auto& [subject, reason] : measured.at("leftOut").as_object()) {
    fmt::print("\n{:18} left out: {}", std::string_view(subject), reason.as_string().c_str());
  }
  fmt::print("\n");
  std::fflush(stdout);
}

json::array MeasureAll(const Options& options) {
  json::array all;
  for (const std::string& name : options.sets) {
    const bool hasOwnSize = name == "iso-codes";
    for (const size_t size : hasOwnSize ? std::vector<size_t>{0} : options.sizes) {
      const std::string text =
          RunInChild([&] { return serialize(MeasureSet(options, name, size)); });
      const json::object measured = json::parse(text).as_object();
      if (measured.empty()) continue;
      Print(measured);
      all.push_back(measured);
    }
  }
  return all;
}

json::object Libraries() {
  json::object libraries;
  for (const SubjectKind& kind : SubjectKinds()) {
    if (!kind.library.empty()) libraries[kind.name] = kind.library;
  }
  return libraries;
}

void WriteFile(const std::string& path, const json::object& document) {
  std::ofstream stream(path);
  stream << document << '\n';
  stream.close();
  if (!stream) throw std::runtime_error("cannot write " + path);
}

}  // namespace

int main(int argc, char** argv) try {
  Options options;
  CLI::App app("Measures what lookups and loads of dictionaries cost.");
  const auto addNames = [&](const char* option, std::vector<std::string>& names) {
    app.add_option(option, names)
        ->delimiter(',')
        ->check(CLI::IsMember(names))
        ->capture_default_str();
  };
  addNames("--sets", options.sets);
  addNames("--subjects", options.subjects);
  addNames("--measures", options.measures);
  app.add_option("--sizes", options.sizes, "keys in a set")
      ->delimiter(',')
      ->check(CLI::PositiveNumber)
      ->capture_default_str();
  app.add_option("--rounds", options.rounds, "the fastest counts")->check(CLI::PositiveNumber);
  app.add_option("--out", options.out, "file for the results, in JSON");
  CLI11_PARSE(app, argc, argv);

  const json::object document = {{"compiler", kCompiler},
                                 {"libraries", Libraries()},
                                 {"rounds", options.rounds},
                                 {"sets", MeasureAll(options)}};
  if (!options.out.empty()) WriteFile(options.out, document);
  return 0;
} catch (const std::exception& error) {
  fmt::print(stderr, "dictionary-bench: {}\n", error.what());
  return 1;
}
