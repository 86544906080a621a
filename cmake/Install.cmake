# What is installed and where. Targets have the same names in this tree as after find_package(Kolvane). Installed
# files refer to each other by relative paths, so that the prefix can be moved.

# Debian's library folder for every prefix, so that the package has the same layout as any other installation.
if(EXISTS /etc/debian_version AND CMAKE_LIBRARY_ARCHITECTURE)
  set(CMAKE_INSTALL_LIBDIR lib/${CMAKE_LIBRARY_ARCHITECTURE} CACHE PATH "Libraries")
endif()
set(CMAKE_INSTALL_DOCDIR share/doc/kolvane CACHE PATH "Documentation")
include(GNUInstallDirs)
include(CMakePackageConfigHelpers)

set(headers ${CMAKE_INSTALL_INCLUDEDIR}/kolvane)
set(package lib/cmake/Kolvane)  # found by projects without a language, too
if(WIN32)
  set(loaded ${CMAKE_INSTALL_BINDIR})
else()
  set(loaded ${CMAKE_INSTALL_LIBDIR})
endif()

# Installs `target` under the name Kolvane::`name`.
function(install_target target name)
  if(name STREQUAL kolvane)
    add_executable(Kolvane::${name} ALIAS ${target})
  else()
    add_library(Kolvane::${name} ALIAS ${target})
    target_include_directories(${target} INTERFACE $<INSTALL_INTERFACE:${headers}>)
  endif()
  set_target_properties(${target} PROPERTIES EXPORT_NAME ${name})
  install(TARGETS ${target} EXPORT KolvaneTargets
    RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR}
    LIBRARY DESTINATION ${loaded}
    ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR})
endfunction()

install_target(kolvane kolvane)
install_target(VRKKolvanes VRKKolvanes)
install_target(VarnelKernel VarnelKernel)
install_target(varnel_kernel_interface VarnelKernelInterface)
install_target(kolvane_translator_interface TranslatorInterface)
install_target(kolvane_translator_messaging TranslatorMessaging)
install_target(varnel_framework VarnelFramework)
install_target(kolvane_lib Dictionary)
install_target(kolvane_platform Platform)

# The headers that programs may include, and the headers that these include.
add_public_headers(
  # Kolvane::VarnelKernel
  wrapper-framework/source/VarnelKernel.h
  varnel-kernel/VarnelKernelHost.h
  # Kolvane::TranslatorMessaging: the translator interface, its client and protocol, and typed data
  kolvane/api/VRKStringTranslatorInterface.h
  kolvane/api/wrapper-framework/VRKStringTranslatorClient.h
  kolvane/api/wrapper-framework/VRKStringTranslatorProtocol.h
  kolvane/api/wrapper-framework/VRKTranslationImage.h
  wrapper-framework/source/Data.h
  wrapper-framework/source/Exceptions.h
  wrapper-framework/source/KernelRefs.h
  wrapper-framework/source/RefHandle.h
  wrapper-framework/source/ReportedCheck.h
  wrapper-framework/source/ResultCodes.h
  # Kolvane::Dictionary
  kolvane/lib/CodePageSelector.h
  kolvane/lib/KolvaneDictionary.h
  kolvane/lib/KolvaneString.h
  kolvane/lib/LoadStatus.h
  kolvane/lib/OVErrException.h
  kolvane/lib/TranslatedString.h)
install(DIRECTORY ${PUBLIC_HEADERS_FOLDER}/ DESTINATION ${headers})

file(RELATIVE_PATH binToLib ${CMAKE_INSTALL_FULL_BINDIR} ${CMAKE_INSTALL_FULL_LIBDIR})
set_target_properties(kolvane PROPERTIES INSTALL_RPATH $ORIGIN/${binToLib})
set_target_properties(VRKKolvanes PROPERTIES INSTALL_RPATH $ORIGIN)

if(MINGW)  # `cmake --install ... --component symbols`
  foreach(target kolvane VRKKolvanes VarnelKernel)
    install(FILES $<TARGET_FILE:${target}>.debug DESTINATION ${CMAKE_INSTALL_BINDIR}
      COMPONENT symbols EXCLUDE_FROM_ALL)
  endforeach()
endif()

# The CMake package.
configure_package_config_file(cmake/KolvaneConfig.cmake.in KolvaneConfig.cmake
  INSTALL_DESTINATION ${package} NO_SET_AND_CHECK_MACRO)
write_basic_package_version_file(KolvaneConfigVersion.cmake COMPATIBILITY SameMinorVersion)
install(EXPORT KolvaneTargets NAMESPACE Kolvane:: DESTINATION ${package})
install(FILES
  ${PROJECT_BINARY_DIR}/KolvaneConfig.cmake
  ${PROJECT_BINARY_DIR}/KolvaneConfigVersion.cmake
  cmake/KolvaneDictionary.cmake
  DESTINATION ${package})

# pkg-config.
file(RELATIVE_PATH pkgConfigToPrefix ${CMAKE_INSTALL_FULL_LIBDIR}/pkgconfig ${CMAKE_INSTALL_PREFIX})
foreach(name kolvane kolvane-dictionary varnel-kernel)
  configure_file(cmake/${name}.pc.in ${name}.pc @ONLY)
  install(FILES ${PROJECT_BINARY_DIR}/${name}.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
endforeach()

# Documentation, examples and completions.
install(DIRECTORY examples DESTINATION ${CMAKE_INSTALL_DOCDIR})
install(FILES docs/dictionaries.md docs/host-guide.md docs/security.md DESTINATION ${CMAKE_INSTALL_DOCDIR}/docs)
if(NOT WIN32)
  find_program(GZIP gzip REQUIRED)
  set(manual ${PROJECT_BINARY_DIR}/kolvane.1.gz)
  add_custom_command(OUTPUT ${manual}
    COMMAND ${GZIP} -9nc ${PROJECT_SOURCE_DIR}/docs/kolvane.1 > ${manual}
    DEPENDS docs/kolvane.1 VERBATIM)
  add_custom_target(kolvane_manual DEPENDS ${manual})
  add_dependencies(kolvane kolvane_manual)  # so that the target `kolvane` builds everything that is installed
  install(FILES ${manual} DESTINATION ${CMAKE_INSTALL_MANDIR}/man1)
  install(FILES tools/kolvane/completions/kolvane.bash RENAME kolvane
    DESTINATION ${CMAKE_INSTALL_DATADIR}/bash-completion/completions)
  if(EXISTS /etc/debian_version)
    set(zsh ${CMAKE_INSTALL_DATADIR}/zsh/vendor-completions)
  else()
    set(zsh ${CMAKE_INSTALL_DATADIR}/zsh/site-functions)
  endif()
  install(FILES tools/kolvane/completions/_kolvane DESTINATION ${zsh})
endif()
