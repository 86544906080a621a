// How much room a character takes on a terminal.
#pragma once

// In columns: 2 for the wide characters of East Asia and for pictographs, 0 for marks that join the
// character before them, else 1. Blocks count as a whole, and marks of rarer scripts as 1.
int DisplayWidth(char32_t character) noexcept;
