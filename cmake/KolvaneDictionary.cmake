#[[
Compiles dictionaries during a build.

  kolvane_add_dictionary(<target> SOURCES <file>...
    [OUTPUT <file>]
    [FORMAT 1.5|1.0]
    [VALUES utf-16|utf-8|code-page]
    [ENCODING auto|image|utf-8])

Adds a target, built by default, that compiles the sources into one binary dictionary. FORMAT, VALUES
and ENCODING are passed to `kolvane compile` as the options of these names. Relative SOURCES are in the
current source folder. A relative OUTPUT (default: `<target>.kdict`) is in the current binary folder.
OUTPUT must be inside the build folder. The target's property KOLVANE_DICTIONARY is the full path of
OUTPUT, for example to install it:

  install(FILES $<TARGET_PROPERTY:<target>,KOLVANE_DICTIONARY> DESTINATION share/example)

The build fails and leaves OUTPUT unchanged if a source is damaged, contains malformed UTF-8, is UTF-16
without a byte-order mark, or is no dictionary. ENCODING image never detects UTF-8: it decodes text as
UTF-16 if there is a byte-order mark of UTF-16, otherwise in the system's code page.

The variable KOLVANE_COMMAND selects the command. By default, it is the one installed with this file. In
a cross build, CMAKE_CROSSCOMPILING_EMULATOR runs that one. Without an emulator, a command for the build
machine is searched for on the PATH.
]]

# Returns the command line of the command, and the file or target that it depends on.
function(_kolvane_find_command outCommand outDepends)
  if(CMAKE_CROSSCOMPILING AND NOT CMAKE_CROSSCOMPILING_EMULATOR)
    find_program(KOLVANE_COMMAND kolvane PATHS ENV PATH NO_DEFAULT_PATH NO_CMAKE_FIND_ROOT_PATH
      DOC "The kolvane command of the build machine")
    if(NOT KOLVANE_COMMAND)
      message(FATAL_ERROR "No kolvane command found that the build machine can run. "
        "Set KOLVANE_COMMAND to one.")
    endif()
  endif()
  if(KOLVANE_COMMAND)
    set(${outCommand} ${KOLVANE_COMMAND} PARENT_SCOPE)
    set(${outDepends} ${KOLVANE_COMMAND} PARENT_SCOPE)
  elseif(CMAKE_CROSSCOMPILING)
    set(${outCommand} ${CMAKE_CROSSCOMPILING_EMULATOR} $<TARGET_FILE:Kolvane::kolvane> PARENT_SCOPE)
    set(${outDepends} Kolvane::kolvane PARENT_SCOPE)
  else()
    set(${outCommand} Kolvane::kolvane PARENT_SCOPE)
    set(${outDepends} Kolvane::kolvane PARENT_SCOPE)
  endif()
endfunction()

# Ensures that the build never overwrites a source or writes into the source tree.
function(_kolvane_check_output output sources)
  cmake_path(IS_PREFIX CMAKE_BINARY_DIR ${output} isInBuild)
  if(NOT isInBuild OR output IN_LIST sources)
    message(FATAL_ERROR "kolvane_add_dictionary: the OUTPUT ${output} is not in the build folder, "
      "or is one of the SOURCES.")
  endif()
endfunction()

function(kolvane_add_dictionary target)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "OUTPUT;FORMAT;VALUES;ENCODING" "SOURCES")
  if(NOT arg_SOURCES OR arg_UNPARSED_ARGUMENTS OR arg_KEYWORDS_MISSING_VALUES)
    message(FATAL_ERROR "kolvane_add_dictionary(<target> SOURCES <file>... [OUTPUT <file>] "
      "[FORMAT <version>] [VALUES <encoding>] [ENCODING <encoding>])")
  endif()

  set(sources)
  foreach(source IN LISTS arg_SOURCES)
    cmake_path(ABSOLUTE_PATH source BASE_DIRECTORY ${CMAKE_CURRENT_SOURCE_DIR} NORMALIZE)
    list(APPEND sources ${source})
  endforeach()
  set(output ${target}.kdict)
  if(arg_OUTPUT)
    set(output ${arg_OUTPUT})
  endif()
  cmake_path(ABSOLUTE_PATH output BASE_DIRECTORY ${CMAKE_CURRENT_BINARY_DIR} NORMALIZE)
  _kolvane_check_output(${output} "${sources}")

  set(options)
  foreach(option FORMAT VALUES ENCODING)
    if(arg_${option})
      string(TOLOWER ${option} name)
      list(APPEND options --${name} ${arg_${option}})
    endif()
  endforeach()

  # The command leaves an up-to-date output untouched, so a stamp file records that the command has run.
  set(stamp ${CMAKE_CURRENT_BINARY_DIR}/CMakeFiles/${target}.stamp)
  cmake_path(GET output PARENT_PATH folder)
  _kolvane_find_command(command commandDepends)
  add_custom_command(OUTPUT ${stamp} ${output}
    COMMAND ${CMAKE_COMMAND} -E make_directory ${folder}
    COMMAND ${command} compile ${sources} -o ${output} ${options}
    COMMAND ${CMAKE_COMMAND} -E touch ${stamp}
    DEPENDS ${sources} ${commandDepends}
    COMMENT "Compiling dictionary ${target}"
    VERBATIM)
  add_custom_target(${target} ALL DEPENDS ${stamp} ${output})
  set_target_properties(${target} PROPERTIES KOLVANE_DICTIONARY ${output})
endfunction()
