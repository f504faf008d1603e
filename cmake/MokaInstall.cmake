# The install rules. CPack makes a package of each component (MokaPackages.cmake).
include(CMakePackageConfigHelpers)

# The libraries of a debug build have the same names in another folder, so that one prefix can contain both builds.
set(MOKA_INSTALL_LIBDIR ${CMAKE_INSTALL_LIBDIR}$<$<CONFIG:Debug>:/moka-debug>)
set(MOKA_INSTALL_BINDIR $<IF:$<CONFIG:Debug>,${CMAKE_INSTALL_LIBDIR}/moka-debug/bin,${CMAKE_INSTALL_BINDIR}>)
set(MOKA_INSTALL_CMAKEDIR ${CMAKE_INSTALL_LIBDIR}/cmake/MokaGraphics)

if(MOKA_INSTALL)
  # Before anything is copied.
  install(SCRIPT ${PROJECT_SOURCE_DIR}/cmake/CheckPrefix.cmake ALL_COMPONENTS)
endif()

# moka_install_if_built(WHAT FILE): if FILE is not built, the install rules that follow in this folder do nothing.
function(moka_install_if_built what file)
  install(CODE "if(NOT EXISTS \"${file}\")
    message(STATUS \"Not built, so not installed: ${what}\")
    return()
  endif()" ALL_COMPONENTS)
endfunction()

# moka_install(PART NAME ...): installs these libraries and their public headers, in the folders of this tree, as a part of
# the package MokaGraphics.
function(moka_install part)
  install(TARGETS ${ARGN} EXPORT MokaGraphics${part}Targets
    LIBRARY DESTINATION ${MOKA_INSTALL_LIBDIR} COMPONENT MokaRuntime NAMELINK_COMPONENT MokaDevelopment
    ARCHIVE DESTINATION ${MOKA_INSTALL_LIBDIR} COMPONENT MokaDevelopment
    FILE_SET HEADERS DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} COMPONENT MokaDevelopment)
  install(EXPORT MokaGraphics${part}Targets NAMESPACE Moka:: DESTINATION ${MOKA_INSTALL_CMAKEDIR}
    COMPONENT MokaDevelopment)
endfunction()

# moka_install_pkg_config(NAME DESCRIPTION LIBS [REQUIRES ...] [STATIC ...]): NAME.pc. LIBS is for the linker;
# STATIC are the packages that a static library needs in addition. The prefix is relative to the file.
function(moka_install_pkg_config name description libs)
  cmake_parse_arguments(PARSE_ARGV 3 arg "" "" "REQUIRES;STATIC")
  if(NOT BUILD_SHARED_LIBS)
    list(APPEND arg_REQUIRES ${arg_STATIC})
    string(APPEND libs " -pthread")
  endif()
  list(JOIN arg_REQUIRES " " requires)
  foreach(kind debug release)
    set(libdir ${CMAKE_INSTALL_FULL_LIBDIR})
    if(kind STREQUAL "debug")
      string(APPEND libdir /moka-debug)
    endif()
    file(RELATIVE_PATH prefix ${libdir}/pkgconfig ${CMAKE_INSTALL_PREFIX})
    string(REGEX REPLACE "/$" "" prefix ${prefix})
    file(RELATIVE_PATH includedir ${CMAKE_INSTALL_PREFIX} ${CMAKE_INSTALL_FULL_INCLUDEDIR})
    file(RELATIVE_PATH libdir ${CMAKE_INSTALL_PREFIX} ${libdir})
    configure_file(${PROJECT_SOURCE_DIR}/cmake/library.pc.in ${PROJECT_BINARY_DIR}/pkgconfig/${kind}/${name}.pc @ONLY)
  endforeach()
  install(FILES ${PROJECT_BINARY_DIR}/pkgconfig/$<IF:$<CONFIG:Debug>,debug,release>/${name}.pc
    DESTINATION ${MOKA_INSTALL_LIBDIR}/pkgconfig COMPONENT MokaDevelopment)
endfunction()

# The files that find_package(MokaGraphics) reads first.
function(moka_install_config)
  set(made ${PROJECT_BINARY_DIR}/cmake)
  configure_file(${PROJECT_SOURCE_DIR}/cmake/MokaGraphicsConfig.cmake.in ${made}/MokaGraphicsConfig.cmake @ONLY)
  write_basic_package_version_file(${made}/MokaGraphicsConfigVersion.cmake COMPATIBILITY SameMinorVersion)
  # CMake prints this text with the versions that it has considered.
  file(APPEND ${made}/MokaGraphicsConfigVersion.cmake "
if(NOT PACKAGE_VERSION_COMPATIBLE)
  string(APPEND PACKAGE_VERSION \" (ask for ${PROJECT_VERSION_MAJOR}.${PROJECT_VERSION_MINOR}, or install the version that you ask for)\")
endif()
")
  install(FILES ${made}/MokaGraphicsConfig.cmake ${made}/MokaGraphicsConfigVersion.cmake
    ${PROJECT_SOURCE_DIR}/cmake/MokaJni.cmake
    DESTINATION ${MOKA_INSTALL_CMAKEDIR} COMPONENT MokaDevelopment)
  install(FILES ${MOKA_GENERATED_HEADERS}/moka/base/Version.h DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/moka/base
    COMPONENT MokaDevelopment)
endfunction()
