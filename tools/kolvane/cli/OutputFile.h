// Files that commands write as a whole or not at all.
#pragma once

#include <string>
#include <string_view>

// Writes beside the file and renames over it, keeping its permissions and the symbolic links on the
// way to it; a file that holds the same bytes already is left untouched. What is there and is no
// regular file is written to directly, and `-` is standard output. Throws Failure with the file's
// name and the system's reason, and leaves the file as it was; ClosedPipe as StandardOutput.h. A
// signal to end the program takes effect before or after, not in between.
void WriteFile(const std::string& name, std::string_view bytes);
