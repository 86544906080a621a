# 32-bit Windows, with SSE2, which speeds up text loads and which Windows 8 and later require.
#
# Hosts may align the stack to 4 bytes only, but aligned SSE spills need 16. -mstackrealign realigns the stack in each
# function that spills. GCC does so by default for this target with SSE; it is explicit because callbacks depend on it.
set(CMAKE_SYSTEM_PROCESSOR x86)
set(triplet i686-w64-mingw32)
set(CMAKE_C_FLAGS_INIT "-msse2 -mstackrealign")
set(CMAKE_CXX_FLAGS_INIT "-msse2 -mstackrealign")
include(${CMAKE_CURRENT_LIST_DIR}/Windows.cmake)
