# 32-bit Windows, with SSE2, which Windows 8 and later require: it speeds up the loading of text.
#
# Hosts may align the stack to 4 bytes only, SSE's aligned spills need 16. -mstackrealign makes each function
# that spills align it; it is GCC's default for this target with SSE, and named since callbacks depend on it.
set(CMAKE_SYSTEM_PROCESSOR x86)
set(triplet i686-w64-mingw32)
set(CMAKE_C_FLAGS_INIT "-msse2 -mstackrealign")
set(CMAKE_CXX_FLAGS_INIT "-msse2 -mstackrealign")
include(${CMAKE_CURRENT_LIST_DIR}/Windows.cmake)
