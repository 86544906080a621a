#include "tools/kolvane/cli/CommandLine.h"

#include <fmt/format.h>

#include <algorithm>
#include <memory>
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

CommandLine::CommandLine(std::string name, std::string operands, std::string about)
    : app(std::move(about), name) {
  app.formatter(std::make_shared<HelpFormatter>(std::move(name), std::move(operands)));
  app.allow_extras();
  app.get_option("--help")->description("Print this help and exit");
}

std::vector<std::string> CommandLine::Parse(int argc, const char* const* argv) {
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
