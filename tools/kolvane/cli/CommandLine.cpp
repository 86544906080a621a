#include "tools/kolvane/cli/CommandLine.h"

#include <fmt/format.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <string_view>
#include <utility>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/cli/StandardOutput.h"

namespace {

class HelpFormatter : public CLI::Formatter {
 public:
  HelpFormatter(std::string commandName, std::string commandOperands)
      : name(std::move(commandName)), operands(std::move(commandOperands)) {
    column_width(34);
  }

  std::string make_usage(const CLI::App*, std::string) const override {
    return fmt::format("\nUsage: {} [OPTION]... {}\n", name, operands);
  }

 private:
  std::string name;
  std::string operands;
};

// Takes the first `--` out of what the options left; what stands before it must not look like an
// option.
std::vector<std::string> Operands(std::vector<std::string> left) {
  const auto marker = std::find(left.begin(), left.end(), "--");
  const auto stray = std::find_if(left.begin(), marker, [](const std::string& word) {
    return word.size() > 1 && word.front() == '-';
  });
  if (stray != marker) throw UsageError(fmt::format("unknown option {}", Printable(*stray)));
  if (marker != left.end()) left.erase(marker);
  return left;
}

// The parser would take the word after `--option=` for the value.
void RefuseEmptyValues(int argc, const char* const* argv) {
  for (int i = 1; i < argc && std::string_view(argv[i]) != "--"; ++i) {
    const std::string_view word = argv[i];
    if (word.starts_with("--") && word.ends_with("=")) {
      throw UsageError(fmt::format("{} lacks its value", Printable(word)));
    }
  }
}

}  // namespace

// The only class that knows the parser library.
class CommandLine::Parser {
 public:
  Parser(std::string name, std::string operands, std::string about) : app(std::move(about), name) {
    app.formatter(std::make_shared<HelpFormatter>(std::move(name), std::move(operands)));
    app.allow_extras();
    app.get_option("--help")->description("Print this help and exit");
  }

  void BeginGroup(std::string heading) { group = std::move(heading); }

  void AddFlag(const Option& option, bool& isGiven) {
    app.add_flag(option.names, isGiven, option.text)->group(group);
  }

  void AddFlag(const Option& option, std::function<void()> whenGiven) {
    app.add_flag_callback(option.names, std::move(whenGiven), option.text)->group(group);
  }

  template <class Target>
  CLI::Option* Add(const Option& option, Target& target) {
    return Describe(option, app.add_option(option.names, target, option.text));
  }

  void AddWord(const Option& option, std::vector<std::string> words,
               std::function<void(size_t)> whenChosen) {
    const auto choose = [words, call = std::move(whenChosen)](const std::string& word) {
      call(static_cast<size_t>(std::ranges::find(words, word) - words.begin()));
    };
    Describe(option, app.add_option_function<std::string>(option.names, choose, option.text))
        ->check(CLI::IsMember(std::move(words)));
  }

  std::vector<std::string> Parse(int argc, const char* const* argv) {
    RefuseEmptyValues(argc, argv);
    try {
      app.parse(argc, argv);
    } catch (const CLI::CallForHelp&) {
      WriteOutput(app.help());
      throw HelpPrinted();
    } catch (const CLI::ParseError& error) {
      throw UsageError(Printable(error.what()));
    }
    return Operands(app.remaining());
  }

 private:
  CLI::Option* Describe(const Option& option, CLI::Option* added) {
    return added->type_name(option.value)->required(option.isRequired)->group(group);
  }

  CLI::App app;
  std::string group;
};

CommandLine::CommandLine(std::string name, std::string operands, std::string about)
    : parser(std::make_unique<Parser>(std::move(name), std::move(operands), std::move(about))) {}

CommandLine::~CommandLine() = default;

void CommandLine::BeginGroup(std::string heading) {
  parser->BeginGroup(std::move(heading));
}

void CommandLine::AddFlag(const Option& option, bool& isGiven) {
  parser->AddFlag(option, isGiven);
}

void CommandLine::AddFlag(const Option& option, std::function<void()> whenGiven) {
  parser->AddFlag(option, std::move(whenGiven));
}

void CommandLine::AddValue(const Option& option, std::string& value) {
  parser->Add(option, value);
}

void CommandLine::AddValue(const Option& option, std::optional<std::string>& value) {
  parser->Add(option, value);
}

void CommandLine::AddValue(const Option& option, std::optional<double>& number) {
  parser->Add(option, number);
}

void CommandLine::AddValues(const Option& option, std::vector<std::string>& values) {
  parser->Add(option, values)->allow_extra_args(false);
}

void CommandLine::AddWord(const Option& option, std::vector<std::string> words,
                          std::function<void(size_t)> whenChosen) {
  parser->AddWord(option, std::move(words), std::move(whenChosen));
}

std::vector<std::string> CommandLine::Parse(int argc, const char* const* argv) {
  return parser->Parse(argc, argv);
}

void CheckFiles(const std::vector<std::string>& files) {
  if (files.empty()) throw UsageError("no file is named");
  if (std::count(files.begin(), files.end(), "-") > 1) {
    throw UsageError("standard input is named twice");
  }
}

std::string OneFile(const std::vector<std::string>& files) {
  CheckFiles(files);
  if (files.size() > 1) throw UsageError("more than one file is named");
  return files.front();
}
