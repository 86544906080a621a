#include "tools/kolvane/cli/Colour.h"

#include <cstdlib>
#include <string_view>

#include "platform/Console.h"

namespace {

std::string_view Variable(const char* name) {
  const char* const value = std::getenv(name);
  return value == nullptr ? std::string_view() : value;
}

}  // namespace

// A console is asked in any case but one, for it may have to be told to show colours.
bool WantsColour(ColourChoice choice) {
  if (choice == ColourChoice::kNever) return false;
  const bool shown = platform::StandardOutputShowsColour();
  if (choice == ColourChoice::kAlways) return true;
  if (!Variable("NO_COLOR").empty()) return false;
  const std::string_view force = Variable("CLICOLOR_FORCE");
  return shown || (!force.empty() && force != "0");
}

void AddColourOption(CommandLine& commandLine, ColourChoice& choice) {
  commandLine.AddChoice<ColourChoice>({.names = "--color",
                                       .text = "When the text has colours (auto, unless told)",
                                       .value = "WHEN"},
                                      {{"auto", ColourChoice::kAuto},
                                       {"always", ColourChoice::kAlways},
                                       {"never", ColourChoice::kNever}},
                                      choice);
}
