// How a run ends, and what is said on standard error on the way.
#pragma once

#include <stdexcept>
#include <string>
#include <string_view>

enum class ExitStatus { kDone = 0, kFindings = 1, kNotDone = 2 };

// Why a command could not do its work; the text is a whole message, without the program's name.
class Failure : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

// Where standard error cannot be written, the message is lost and nothing else.
void Say(std::string_view message);

// The text with its control characters written as escapes, so that a message stays one line.
std::string Printable(std::string_view text);

// The beginning of a text that may be long, printable, with dots for what is left out.
std::string Excerpt(std::string_view text);
