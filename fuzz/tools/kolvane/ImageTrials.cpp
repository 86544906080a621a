// What `kolvane compile`, `convert` and `dump` make of any bytes.
#include <algorithm>
#include <nlohmann/json.hpp>

#include "fuzz/Input.h"
#include "fuzz/tools/kolvane/CommandTrial.h"
#include "kolvane/lib/DictionaryReader.h"
#include "tools/kolvane/text/UTF8.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

using JSON = nlohmann::json;

Answers AnswersIn(const JSON& entries) {
  Answers answers;
  for (const JSON& entry : entries) {
    const auto key = entry.contains("key")
                         ? entry["key"].get<std::string>()
                         : std::string(AsText(entry["keyBytes"].get<std::vector<uint8_t>>()));
    const auto value = entry.contains("value")
                           ? ToUTF16(entry["value"].get_ref<const std::string&>())
                           : entry["valueUnits"].get<std::vector<uint16_t>>();
    answers[key] = {value.begin(), value.end()};
  }
  return answers;
}

void RequireRefusal(const CommandRun& run) {
  Require(run.status == ExitStatus::kNotDone && run.output.empty(),
          "what is no dictionary is not printed");
}

void TryDumpAsJSON(Trial& trial) {
  const bool isSorted = !trial.choices.OneIn(2);
  const Words options = isSorted ? Words{"dump", "--json", "--sort"} : Words{"dump", "--json"};
  const CommandRun run = trial.Run(options + Words{trial.files.front()});
  const Loaded input({trial.files.front()}, trial.encoding);
  if (!input.areDictionaries) return RequireRefusal(run);
  const JSON entries = JSON::parse(run.output)["entries"];
  Require(entries.size() == input.answers.size(), "JSON has each entry once");
  Require(AnswersIn(entries) == input.answers, "JSON has what a translator finds");
  Require((run.status == ExitStatus::kDone) == input.isWhole, "the status tells of damage");
  if (!input.isWhole || !isSorted) return;
  const auto image = trial.Written(Words{"compile", trial.files.front()} + trial.encodingOption);
  Require(image.has_value(), "what is whole compiles");
  const Words copy = {trial.Write("compiled", *image)};
  Require(RunCommand(options + copy).output == run.output, "an image tells all");
}

void TryDumpAsText(Trial& trial) {
  const bool isUTF16 = trial.choices.OneIn(2);
  Words options = {"dump"};
  if (trial.choices.OneIn(2)) options.push_back("--sort");
  if (isUTF16) options.push_back("--utf-16");
  const CommandRun run = trial.Run(options + Words{trial.files.front()});
  const Loaded input({trial.files.front()}, trial.encoding);
  if (!input.areDictionaries) return RequireRefusal(run);
  const bool isLost = run.said.find("cannot be written as text") != run.said.npos;
  Require((run.status == ExitStatus::kDone) == (input.isWhole && !isLost), "the status tells all");
  Require(isUTF16 || IsValidUTF8(run.output), "text is UTF-8");
  const Words text = {trial.Write("text", run.output)};
  const Loaded back(text, FileEncoding::kAuto);
  Require(back.isWhole, "text is whole");
  Require(isLost || back.answers == input.answers, "text loads back");
  Require(RunCommand(options + text).output == run.output, "text is the same the next time");
}

// UTF-16 in little-endian order of the text in `name`, or none where it is no text.
std::optional<std::string> InUTF16(const Trial& trial, const std::string& name,
                                   const Words& encodingOption) {
  return trial.Written(Words{"convert", "--to", "utf-16le", name} + encodingOption);
}

// The mark of UTF-16 is a part of the first line, which only matters where there are no quotes.
void RequireSameLoad(const std::string& name, FileEncoding encoding, const Loaded& expected) {
  const Loaded loaded({name}, encoding);
  const ImageFile file = ReadImageFile(name, encoding);
  const bool isUTF8 = !file.utf8.empty();
  const bool isMarked =
      !isUTF8 && tovali_private::EncodingFromBOM(file.bytes) != TextEncoding::kCodePage;
  const bool isQuoted = WithoutUTF8Mark(isUTF8 ? file.utf8 : file.bytes).starts_with('"');
  const bool isLoaded = (isMarked || isQuoted) && !loaded.isTooShort && !expected.isTooShort;
  Require(!isLoaded || loaded.answers == expected.answers, "the encoding alone changes");
}

}  // namespace

void TryCompile(Trial& trial) {
  const std::string values = trial.Pick({"utf-16", "utf-8", "code-page"});
  const Words options = {"compile", "--format", trial.Pick({"1.0", "1.5"}), "--values", values};
  const auto image = trial.Written(options + trial.encodingOption + trial.files);
  const Loaded inputs(trial.files, trial.encoding);
  Require(inputs.isWhole || !image, "nothing is made of what is damaged");
  Require(image || !inputs.isWhole || values != "utf-16", "UTF-16 carries everything");
  if (!image) return;
  const Words copy = {trial.Write("image", *image)};
  const Loaded back(copy, trial.encoding);
  Require(back.isWhole && back.answers == inputs.answers, "an image has what its inputs have");
  Require(trial.Written(options + copy) == image, "equal contents, equal bytes");
}

void TryConvert(Trial& trial) {
  const std::string& input = trial.files.front();
  const std::string target = trial.Pick({"utf-8", "utf-16le", "utf-16be", "code-page"});
  const auto output = trial.Written(Words{"convert", "--to", target, input} + trial.encodingOption);
  if (!output) return;
  const std::string copy = trial.Write("converted", *output);
  const FileEncoding encoding = target == "utf-8" ? FileEncoding::kUTF8 : FileEncoding::kImage;
  const Words encodingOption = {"--encoding", target == "utf-8" ? "utf-8" : "image"};
  const auto units = InUTF16(trial, input, trial.encodingOption);
  Require(units.has_value(), "UTF-16 carries everything");
  Require(InUTF16(trial, copy, encodingOption) == units, "the text stays");
  const Loaded expected({trial.Write("units", *units)}, FileEncoding::kImage);
  RequireSameLoad(input, trial.encoding, expected);
  RequireSameLoad(copy, encoding, expected);
}

void TryDump(Trial& trial) {
  trial.choices.OneIn(2) ? TryDumpAsJSON(trial) : TryDumpAsText(trial);
}
