// What a command gets from the console that it is called from, and gives back.
#pragma once

#include <string>
#include <vector>

namespace platform {

// The words of the command line, in UTF-8, the command's own first. Takes what main was given.
std::vector<std::string> Arguments(int count, char** words);

bool StandardInputIsTerminal() noexcept;

// Whether standard output is a terminal that shows colours. A console that has to be told to show
// them is told, until the program ends.
bool StandardOutputShowsColour() noexcept;

// Whether what failed last was a write to a pipe that nobody reads any more. To be asked at once.
bool HitClosedPipe() noexcept;

// From now on every byte passes the standard streams as it is, and a console takes it for UTF-8.
void SpeakUTF8() noexcept;

}  // namespace platform
