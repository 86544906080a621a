// Code-page selectors, which name the encoding of multibyte text.
//
// A selector is a `const int*` that is borrowed for the call:
//
// - a pointer to kUTF8Selector selects UTF-8;
// - null, or a pointer to any other value, selects the system's default code page: the active code
//   page on Windows, windows-1252 elsewhere.
#pragma once

inline constexpr int kUTF8Selector = 1;
