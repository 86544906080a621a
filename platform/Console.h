// The command line and the standard streams of a console program.
#pragma once

#include <string>
#include <vector>

namespace platform {

// Returns the arguments in UTF-8, beginning with the program's name. Takes the arguments of main.
std::vector<std::string> Arguments(int count, char** words);

bool StandardInputIsTerminal() noexcept;

// Whether standard output is a terminal that shows colours. Enables colours in a console that needs
// it, until the program ends.
bool StandardOutputShowsColour() noexcept;

// Whether the latest failure was a write to a closed pipe. Requires: no other call since that
// write.
bool HitClosedPipe() noexcept;

// Sets the standard streams to binary mode, and a console to UTF-8, until the program ends.
void SpeakUTF8() noexcept;

}  // namespace platform
