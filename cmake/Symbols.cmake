# Moves the symbols of a Windows program or library, which are as large as its code, into `<file>.debug` beside it.
# Debuggers find that file by a link that stays in the binary. On other systems, packaging strips the symbols.
function(separate_symbols target)
  if(NOT MINGW)
    return()
  endif()
  set(file $<TARGET_FILE:${target}>)
  add_custom_command(TARGET ${target} POST_BUILD
    COMMAND ${CMAKE_OBJCOPY} --only-keep-debug ${file} ${file}.debug
    COMMAND ${CMAKE_OBJCOPY} --strip-all --add-gnu-debuglink=${file}.debug ${file}
    VERBATIM)
endfunction()
