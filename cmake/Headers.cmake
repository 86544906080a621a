# Headers are included by their path from the root. A target sees its own headers and those of the targets it links,
# through links in a folder of the build tree. An include of any other header does not compile.

# add_headers(target PUBLIC|PRIVATE|INTERFACE header...)
function(add_headers target scope)
  file(RELATIVE_PATH folder ${PROJECT_SOURCE_DIR} ${CMAKE_CURRENT_SOURCE_DIR})
  string(TOLOWER ${scope} scopeFolder)
  set(root ${PROJECT_BINARY_DIR}/include/${target}/${scopeFolder})
  file(REMOVE_RECURSE ${root})
  file(MAKE_DIRECTORY ${root}/${folder})
  foreach(header ${ARGN})
    file(CREATE_LINK ${CMAKE_CURRENT_SOURCE_DIR}/${header} ${root}/${folder}/${header} SYMBOLIC)
  endforeach()
  target_include_directories(${target} ${scope} $<BUILD_INTERFACE:${root}>)
endfunction()

# add_public_headers(path...): copies headers, given by their paths from the root, into PUBLIC_HEADERS_FOLDER. There,
# as in an installation, all headers are in one folder, and include each other by file name.
set(PUBLIC_HEADERS_FOLDER ${PROJECT_BINARY_DIR}/public)
function(add_public_headers)
  foreach(path ${ARGN})
    set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${path})
    get_filename_component(name ${path} NAME)
    file(READ ${path} text)
    string(REGEX REPLACE "#include \"[^\"]*/" "#include \"" text "${text}")
    file(CONFIGURE OUTPUT ${PUBLIC_HEADERS_FOLDER}/${name} CONTENT "${text}" @ONLY)
  endforeach()
endfunction()
