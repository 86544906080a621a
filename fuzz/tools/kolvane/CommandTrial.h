// What the trials of commands share: commands as `kolvane` runs them, on files in a folder of their
// own, and what a translator has of those files.
#pragma once

#include <filesystem>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "fuzz/Choices.h"
#include "tests/kolvane/lib/Support.h"
#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/dictionary/ImageFile.h"

using Words = std::vector<std::string>;

Words operator+(Words words, const Words& more);

// How it ended, what it wrote to standard output, and the messages that it said.
struct CommandRun {
  ExitStatus status;
  std::string output;
  std::string said;
};

// The first word names the command. Requires that messages are as users need them.
CommandRun RunCommand(const Words& words);

// The files, with a folder that goes with this, and how commands are told to take them.
class Trial {
 public:
  Trial(const uint8_t* choice, size_t choiceCount, const std::vector<std::string>& contents);
  Trial(const Trial&) = delete;
  Trial& operator=(const Trial&) = delete;
  ~Trial();

  std::string Pick(const Words& words);

  // With the option that says how the files are encoded.
  CommandRun Run(const Words& words) const { return RunCommand(words + encodingOption); }

  // What a command writes with `-o`, or none where it refuses, which it does without a trace.
  std::optional<std::string> Written(const Words& words) const;

  // Returns the name that commands know the file by.
  std::string Write(std::string_view name, std::string_view bytes) const;

  Choices choices;
  FileEncoding encoding = FileEncoding::kAuto;
  Words encodingOption;
  Words files;

 private:
  std::filesystem::path folder;
  bool isOutputThere;  // before something is written
};

// What a translator has of the files, once it has loaded them in turn.
struct Loaded {
  Loaded(const Words& files, FileEncoding encoding);

  DictionaryTable table;
  Answers answers;
  bool areDictionaries = true;  // as far as that can be told
  bool isWhole = true;
  bool isTooShort = false;  // one of them
};

// A trial of each command.
void TryCheck(Trial& trial);
void TryCompile(Trial& trial);
void TryConvert(Trial& trial);
void TryDump(Trial& trial);
void TryStats(Trial& trial);
