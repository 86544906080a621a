// One command's options, operands and help, with the habits that all commands keep.
#pragma once

#include <algorithm>
#include <functional>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

// A wrong command line; says what is wrong in one line.
class UsageError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

struct Option {
  const char* names;       // "-o,--output"
  const char* text;        // one line of help
  const char* value = "";  // what the help calls its value
  bool isRequired = false;
};

// Words that an option takes, each with the value that it stands for.
template <class Value>
using Choices = std::vector<std::pair<std::string, Value>>;

// Operands are whatever the options leave, taken exactly as they are; everything after `--` is one.
class CommandLine {
 public:
  // `name` is the command as it is called, `operands` its operands as the help shows them, and
  // `about` one line of purpose, an empty line and the examples.
  CommandLine(std::string name, std::string operands, std::string about);
  CommandLine(const CommandLine&) = delete;
  CommandLine& operator=(const CommandLine&) = delete;
  ~CommandLine();

  // Lists the options that are added next under this heading of the help.
  void BeginGroup(std::string heading);

  // Each adds an option that sets a variable of the caller's, which outlives Parse. Only options
  // with several values may be repeated.
  void AddFlag(const Option& option, bool& isGiven);
  void AddFlag(const Option& option, std::function<void()> whenGiven);
  void AddValue(const Option& option, std::string& value);
  void AddValue(const Option& option, std::optional<std::string>& value);
  void AddValue(const Option& option, std::optional<double>& number);
  void AddValues(const Option& option, std::vector<std::string>& values);

  template <class Value>
  void AddChoice(const Option& option, Choices<Value> choices, Value& chosen) {
    std::vector<std::string> words;
    for (const auto& [word, value] : choices) words.push_back(word);
    AddWord(option, std::move(words), [choices = std::move(choices), &chosen](size_t index) {
      chosen = choices[index].second;
    });
  }

  // Sets what the options name and returns the operands. Where help is asked for it is printed and
  // HelpPrinted is thrown; throws UsageError for an option that does not exist or lacks its value.
  struct HelpPrinted {};
  std::vector<std::string> Parse(int argc, const char* const* argv);

 private:
  class Parser;

  void AddWord(const Option& option, std::vector<std::string> words,
               std::function<void(size_t)> whenChosen);

  std::unique_ptr<Parser> parser;
};

// For operands that name files to read: throws UsageError where there is none, and where standard
// input (`-`), which can be read once, is named twice.
void CheckFiles(const std::vector<std::string>& files);

// The file of a command that takes one; throws UsageError where there is none, and where there are
// more.
std::string OneFile(const std::vector<std::string>& files);
