# How every target of this tree is compiled, and the functions that declare one.

# Flags for all our code. No contraction: x86-64 and arm64 must agree to the bit.
add_library(moka_compile_options INTERFACE)
target_compile_options(moka_compile_options INTERFACE
  -ffp-contract=off -Wall -Wextra -Wpedantic -Wconversion -Wshadow -Wnon-virtual-dtor
  $<$<BOOL:${MOKA_WARNINGS_AS_ERRORS}>:-Werror>)
target_compile_definitions(moka_compile_options INTERFACE $<$<CONFIG:Debug>:MOKA_CHECKS=1>)
if(MOKA_SANITIZE)
  target_compile_options(moka_compile_options INTERFACE
    -fsanitize=${MOKA_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer -O1)
  target_link_options(moka_compile_options INTERFACE -fsanitize=${MOKA_SANITIZE})
endif()

set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)

# moka_library(NAME [SHARED|OBJECT|INTERFACE] OUTPUT name SOURCES ... HEADERS ... PUBLIC deps PRIVATE deps)
# HEADERS is the one list of public headers: what is installed, and what the build compiles alone, each in a
# translation unit of its own, so that a header which needs another one included first does not build.
function(moka_library name kind)
  cmake_parse_arguments(PARSE_ARGV 2 arg "" "OUTPUT" "SOURCES;HEADERS;PUBLIC;PRIVATE")
  add_library(${name} ${kind} ${arg_SOURCES})
  if(kind STREQUAL "SHARED")
    # Loadable where pages have 16 KB, as on new Android devices.
    target_link_options(${name} PRIVATE -Wl,-z,max-page-size=16384)
  endif()
  set(scope PUBLIC)
  if(kind STREQUAL "INTERFACE")
    set(scope INTERFACE)
  endif()
  if(arg_HEADERS)
    target_sources(${name} ${scope} FILE_SET HEADERS BASE_DIRS ${PROJECT_SOURCE_DIR} FILES ${arg_HEADERS})
    set_target_properties(${name} PROPERTIES VERIFY_INTERFACE_HEADER_SETS ON)
  endif()
  target_include_directories(${name} ${scope}
    $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}> $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>)
  target_link_libraries(${name} ${scope} ${arg_PUBLIC})
  if(NOT kind STREQUAL "INTERFACE")
    target_link_libraries(${name} PRIVATE $<BUILD_INTERFACE:moka_compile_options> ${arg_PRIVATE})
  endif()
  if(arg_OUTPUT)
    # Installed, the libraries find each other where they lie.
    set_target_properties(${name} PROPERTIES
      OUTPUT_NAME ${arg_OUTPUT} VERSION ${PROJECT_VERSION} SOVERSION 0 INSTALL_RPATH "\$ORIGIN")
  endif()
endfunction()

# moka_install(NAME ...): these libraries and their public headers, in the tree they have here, for find_package.
function(moka_install)
  install(TARGETS ${ARGN} EXPORT MokaGraphicsTargets FILE_SET HEADERS DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
endfunction()

# moka_executable(NAME SOURCES ... LIBRARIES ...)
function(moka_executable name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "SOURCES;LIBRARIES")
  add_executable(${name} ${arg_SOURCES})
  target_include_directories(${name} PRIVATE ${PROJECT_SOURCE_DIR})
  target_link_libraries(${name} PRIVATE moka_compile_options ${arg_LIBRARIES})
  if(MOKA_SANITIZE)
    target_sources(${name} PRIVATE ${PROJECT_SOURCE_DIR}/cmake/KeepModules.cpp)
  endif()
endfunction()
