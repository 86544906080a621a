# Some folders hold a header for others beside headers of their own. This shows a target's users the
# one and not the others: they get a folder with a link to it.
function(add_public_header target scope header)
  set(folder ${CMAKE_CURRENT_BINARY_DIR}/include)
  file(MAKE_DIRECTORY ${folder})
  file(CREATE_LINK ${CMAKE_CURRENT_SOURCE_DIR}/${header} ${folder}/${header} SYMBOLIC)
  target_sources(${target} ${scope} FILE_SET HEADERS BASE_DIRS ${folder} FILES ${folder}/${header})
endfunction()
