# Shared by the toolchain files for Windows: Debian's MinGW-w64 compiles, Wine runs the programs. Requires: `triplet`.
set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_C_COMPILER ${triplet}-gcc-posix)
set(CMAKE_CXX_COMPILER ${triplet}-g++-posix)
set(CMAKE_CROSSCOMPILING_EMULATOR wine)  # selects the loader that fits the program, or the only one installed
set(CMAKE_FIND_ROOT_PATH /usr/${triplet})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

# GCC 12 reports false positives of -Wrestrict.
string(APPEND CMAKE_CXX_FLAGS_INIT " -Wno-restrict")

# Links the compiler's runtime statically: hosts need not ship it, and versions cannot conflict.
foreach(kind EXE SHARED MODULE)
  set(CMAKE_${kind}_LINKER_FLAGS_INIT -static)
endforeach()
