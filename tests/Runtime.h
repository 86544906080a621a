// Whether programs and the libraries that they load share one C++ runtime, so that exceptions pass from
// one to the other and the program's operator new serves both. Not where each brings its own.
#pragma once

#if defined(_WIN32)
inline constexpr bool kLibrariesShareRuntime = false;
#else
inline constexpr bool kLibrariesShareRuntime = true;
#endif
