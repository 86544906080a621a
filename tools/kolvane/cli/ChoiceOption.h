// An option whose value is one of a few words.
#pragma once

#include <CLI/CLI.hpp>
#include <map>
#include <string>

// Sets `chosen` to what the given word stands for. `choices` and `chosen` outlive the parsing.
template <class Value>
CLI::Option* AddChoice(CLI::App& options, const char* name,
                       const std::map<std::string, Value>& choices, Value& chosen,
                       const char* text) {
  return options
      .add_option_function<std::string>(
          name, [&](const std::string& word) { chosen = choices.at(word); }, text)
      ->check(CLI::IsMember(&choices));
}
