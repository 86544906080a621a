# The Debian package: `cpack -G DEB` in the build folder.
if(WIN32 OR NOT PROJECT_IS_TOP_LEVEL)
  return()
endif()

set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME kolvane)
set(CPACK_PACKAGE_CONTACT "Kolvane developers <kolvane@example.org>")
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "localised strings for a host application")
set(CPACK_PACKAGE_DESCRIPTION
"A program carries its texts as keys with default texts. Kolvane returns the
dictionary's translation of a key, or the default text if there is none.
.
This package contains the kolvane command, which checks, compiles and queries
dictionaries; the plug-in and the kernel that hosts load; and the headers,
static libraries, CMake files and pkg-config files for building hosts.")
set(CPACK_STRIP_FILES ON)
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_INSTALL_DEFAULT_DIRECTORY_PERMISSIONS
  OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)

set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SECTION devel)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${CMAKE_LIBRARY_OUTPUT_DIRECTORY})
set(CPACK_DEBIAN_PACKAGE_SUGGESTS "libboost1.81-dev, cmake, pkg-config")
file(WRITE ${PROJECT_BINARY_DIR}/triggers "activate-noawait ldconfig\n")
set(CPACK_DEBIAN_PACKAGE_CONTROL_EXTRA ${PROJECT_BINARY_DIR}/triggers)
include(CPack)
