// One command's options, operands and help, with the habits that all commands keep.
#pragma once

#include <CLI/CLI.hpp>
#include <stdexcept>
#include <string>
#include <vector>

// A wrong command line; says what is wrong in one line.
class UsageError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

// Operands are whatever the options leave, taken exactly as they are; everything after `--` is one.
class CommandLine {
 public:
  // `name` is the command as it is called, `operands` its operands as the help shows them, and
  // `about` one line of purpose, an empty line and the examples.
  CommandLine(std::string name, std::string operands, std::string about);

  CLI::App& Options() noexcept { return app; }

  // Sets what the options name and returns the operands. Where help is asked for it is printed and
  // HelpPrinted is thrown; throws UsageError for an option that does not exist or lacks its value.
  struct HelpPrinted {};
  std::vector<std::string> Parse(int argc, const char* const* argv);

 private:
  CLI::App app;
};

// For operands that name files to read: throws UsageError where there is none, and where standard
// input (`-`), which can be read once, is named twice.
void CheckFiles(const std::vector<std::string>& files);

// The file of a command that takes one; throws UsageError where there is none, and where there are
// more.
std::string OneFile(const std::vector<std::string>& files);
