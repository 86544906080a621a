# Moves the symbols of a Windows program or library into a file beside it, `<file>.debug`, which debuggers find
# by the link that is left. They take as much room as the code. On other systems packages strip them.
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
