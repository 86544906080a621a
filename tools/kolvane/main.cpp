// The kolvane command: finds the subcommand and runs it.
#include <fmt/format.h>

#include <algorithm>
#include <string>
#include <string_view>
#include <vector>

#include "platform/Console.h"
#include "tools/kolvane/cli/CommandLine.h"
#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/cli/ErrorBoundary.h"
#include "tools/kolvane/cli/StandardOutput.h"
#include "tools/kolvane/commands/Commands.h"

namespace {

struct Command {
  const char* name;
  const char* purpose;
  ExitStatus (*run)(int argc, const char* const* argv);
};

constexpr Command kCommands[] = {
    {"check", "tell what is wrong with dictionaries", RunCheck},
    {"compile", "make a binary image of dictionaries", RunCompile},
    {"convert", "change the encoding of a text dictionary", RunConvert},
    {"dump", "print a dictionary as text", RunDump},
    {"stats", "count what dictionaries hold, and what is translated", RunStats},
    {"translate", "translate keys with dictionaries", RunTranslate},
};

constexpr const char* kHelp =
    R"(Work with Kolvane dictionaries.

Examples:
  kolvane translate --dictionary de.txt '$$$/Dialog/Cancel=Cancel'
  kolvane check --reference en.txt de.txt
  kolvane help translate

Usage: kolvane COMMAND [ARGUMENT]...

Commands:
)";

constexpr const char* kHelpEnd =
    R"(
Options:
  -h,--help                   Print this help and exit
  --version                   Print the version and exit

'kolvane COMMAND --help' tells what a command does and takes.
)";

void PrintHelp() {
  WriteOutput(kHelp);
  for (const Command& command : kCommands) {
    WriteOutput(fmt::format("  {:<27} {}\n", command.name, command.purpose));
  }
  WriteOutput(kHelpEnd);
}

void PrintVersion() {
  WriteOutput(
      fmt::format("kolvane {}\nreads and writes binary dictionaries of versions 1.0 and 1.5\n",
                  KOLVANE_VERSION));
}

ExitStatus RunNamed(std::string_view name, int argc, const char* const* argv) {
  for (const Command& command : kCommands) {
    if (name != command.name) continue;
    return Guard(name, [&] { return command.run(argc, argv); });
  }
  throw UsageError(fmt::format("unknown command '{}'", Printable(name)));
}

ExitStatus Run(int argc, const char* const* argv) {
  if (argc < 2) throw UsageError("no command");
  const std::string_view first = argv[1];
  if (first == "--version") {
    PrintVersion();
    return ExitStatus::kDone;
  }
  if (first == "--help" || first == "-h" || (first == "help" && argc == 2)) {
    PrintHelp();
    return ExitStatus::kDone;
  }
  if (first == "help") {
    const char* const askHelp[] = {argv[2], "--help"};
    return RunNamed(argv[2], 2, askHelp);
  }
  return RunNamed(first, argc - 1, argv + 1);
}

}  // namespace

int main(int argc, char** argv) {
  platform::SpeakUTF8();
  const ExitStatus run = Guard("", [&] {
    const std::vector<std::string> arguments = platform::Arguments(argc, argv);
    std::vector<const char*> words(arguments.size());
    std::ranges::transform(arguments, words.begin(), &std::string::c_str);
    return Run(static_cast<int>(words.size()), words.data());
  });
  const ExitStatus closed = Guard("", [] {
    CloseOutput();
    return ExitStatus::kDone;
  });
  return static_cast<int>(std::max(run, closed));
}
