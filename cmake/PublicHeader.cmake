# Some folders hold a header for others beside headers of their own. This shows a target's users the
# one and not the others: in this tree they get a folder with a link to it. What it includes comes
# from the targets named after it. Where it is installed is said in cmake/Install.cmake.
function(add_public_header target scope header)
  set(folder ${CMAKE_CURRENT_BINARY_DIR}/include)
  file(MAKE_DIRECTORY ${folder})
  file(CREATE_LINK ${CMAKE_CURRENT_SOURCE_DIR}/${header} ${folder}/${header} SYMBOLIC)
  add_library(${target}_header INTERFACE)
  target_sources(${target}_header INTERFACE
    FILE_SET HEADERS BASE_DIRS ${folder} FILES ${folder}/${header})
  target_link_libraries(${target}_header INTERFACE ${ARGN})
  target_link_libraries(${target} ${scope} $<BUILD_INTERFACE:${target}_header>)
endfunction()
