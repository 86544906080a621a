// Any bytes as the files of `kolvane check`, `compile`, `convert`, `dump` and `stats`.
#include "fuzz/tools/kolvane/CommandTrial.h"

#include <algorithm>
#include <array>
#include <fstream>
#include <iterator>
#include <map>
#include <random>

#include "fuzz/Input.h"
#include "tools/kolvane/cli/ErrorBoundary.h"
#include "tools/kolvane/cli/StandardOutput.h"
#include "tools/kolvane/commands/Commands.h"
#include "tools/kolvane/dictionary/DictionaryFile.h"
#include "tools/kolvane/dictionary/FileKind.h"
#include "tools/kolvane/text/UTF8.h"

namespace {

namespace fs = std::filesystem;

const std::map<std::string, decltype(&RunCheck)> kCommands = {{"check", RunCheck},
                                                              {"compile", RunCompile},
                                                              {"convert", RunConvert},
                                                              {"dump", RunDump},
                                                              {"stats", RunStats}};

std::string gOutput, gSaid;

std::string NameOf(const fs::path& path) {
  const std::u8string name = path.u8string();
  return {name.begin(), name.end()};
}

std::optional<std::string> BytesOf(const fs::path& path) {
  std::ifstream stream(path, std::ios::binary);
  if (!stream.is_open()) return {};
  return std::string(std::istreambuf_iterator<char>(stream), {});
}

}  // namespace

// The command's own ones, which are not linked then, write to the standard streams.

void Say(std::string_view message) {
  Require(!message.empty() && IsValidUTF8(message), "messages are UTF-8");
  Require(Printable(message) == message, "messages are one line, without controls");
  gSaid.append(message) += '\n';
}

void WriteOutput(std::string_view text) {
  gOutput += text;
}

void FlushOutput() {}

Words operator+(Words words, const Words& more) {
  words.insert(words.end(), more.begin(), more.end());
  return words;
}

CommandRun RunCommand(const Words& words) {
  std::vector<const char*> argv(words.size());
  std::ranges::transform(words, argv.begin(), &std::string::c_str);
  gOutput.clear();
  gSaid.clear();
  const ExitStatus status = Guard(words.front(), [&] {
    return kCommands.at(words.front())(static_cast<int>(argv.size()), argv.data());
  });
  Require(status != ExitStatus::kNotDone || !gSaid.empty(), "who refuses says why");
  return {status, std::move(gOutput), std::move(gSaid)};
}

Trial::Trial(const uint8_t* choice, size_t choiceCount, const std::vector<std::string>& contents)
    : choices(choice, choiceCount),
      folder(fs::temp_directory_path() /
             ("kolvane-fuzz-" + std::to_string(std::random_device()()))) {
  encodingOption = {"--encoding", Pick({"auto", "image", "utf-8"})};
  if (encodingOption.back() == "image") encoding = FileEncoding::kImage;
  if (encodingOption.back() == "utf-8") encoding = FileEncoding::kUTF8;
  isOutputThere = choices.OneIn(2);
  fs::create_directory(folder);
  for (const std::string& bytes : contents) {
    files.push_back(Write("\u00E9, &" + std::to_string(files.size()), bytes));
  }
}

Trial::~Trial() {
  fs::remove_all(folder);
}

std::string Trial::Pick(const Words& words) {
  return words[choices.Below(static_cast<uint32_t>(words.size()))];
}

std::string Trial::Write(std::string_view name, std::string_view bytes) const {
  const fs::path file = folder / std::u8string(name.begin(), name.end());
  std::ofstream(file, std::ios::binary) << bytes;
  return NameOf(file);
}

std::optional<std::string> Trial::Written(const Words& words) const {
  const fs::path out = folder / "out";
  fs::remove(out);
  if (isOutputThere) Write("out", "as it was");
  const auto before = BytesOf(out);
  const CommandRun run = RunCommand(words + Words{"-o", NameOf(out)});
  Require(run.output.empty(), "what has an output file writes nothing else");
  for (const auto& file : fs::directory_iterator(folder)) {
    Require(file.path().extension() != ".tmp", "no file is left behind");
  }
  const auto after = BytesOf(out);
  if (run.status == ExitStatus::kDone) return after;
  Require(run.status == ExitStatus::kNotDone, "all is written or nothing");
  Require(after == before, "who refuses leaves what was there");
  return {};
}

Loaded::Loaded(const Words& files, FileEncoding encoding) {
  for (const std::string& name : files) {
    const ImageFile file = ReadImageFile(name, encoding);
    const LoadStatus status = LoadInto(table, file);
    areDictionaries = areDictionaries && KindOf(file) == FileKind::kDictionary;
    isWhole = isWhole && areDictionaries && status.Complete() && IsValidUTF8(file.utf8);
    isTooShort = isTooShort || status.damage == LoadDamage::kTooShort;
  }
  answers = AnswersOf(table);
}

// The first bytes choose the command and its options; then come files.
int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  constexpr size_t kChoices = 6;
  constexpr std::array kTries = {TryCheck, TryCompile, TryConvert, TryDump, TryStats};
  const size_t head = std::min(size, kChoices);
  Trial trial(data, head, Pieces(data + head, size - head));
  kTries[trial.choices.Below(kTries.size())](trial);
  return 0;
}
