# The compiler flags of all targets, and the functions that declare targets.

# Flags for all our code. No contraction: x86-64 and arm64 must agree to the bit.
add_library(moka_compile_options INTERFACE)
target_compile_options(moka_compile_options INTERFACE
  -ffp-contract=off -Wall -Wextra -Wpedantic -Wconversion -Wshadow -Wnon-virtual-dtor
  $<$<BOOL:${MOKA_WARNINGS_AS_ERRORS}>:-Werror>)
target_compile_definitions(moka_compile_options INTERFACE $<$<CONFIG:Debug>:MOKA_CHECKS=1>)
if(MOKA_SANITIZE)
  # Reports need only line numbers; full debugging information would double the compile time.
  target_compile_options(moka_compile_options INTERFACE
    -fsanitize=${MOKA_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer -O1 -g1)
  target_link_options(moka_compile_options INTERFACE -fsanitize=${MOKA_SANITIZE})
endif()

set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)

# The number of the binary interface. While the major version is 0, it includes the minor version.
set(MOKA_SOVERSION ${PROJECT_VERSION_MAJOR})
if(PROJECT_VERSION_MAJOR EQUAL 0)
  string(APPEND MOKA_SOVERSION .${PROJECT_VERSION_MINOR})
endif()
set(MOKA_GENERATED_HEADERS ${PROJECT_BINARY_DIR}/include)
configure_file(${PROJECT_SOURCE_DIR}/cmake/Version.h.in ${MOKA_GENERATED_HEADERS}/moka/base/Version.h @ONLY)

# moka_library(NAME KIND [OUTPUT name] [EXPORT name] SOURCES ... HEADERS ... PUBLIC deps PRIVATE deps)
# KIND is that of add_library, or LIBRARY: shared, or static with BUILD_SHARED_LIBS=OFF. EXPORT is the name that others link,
# as Moka::name: an alias in this tree, and the installed target.
# HEADERS is the list of public headers. They are installed. The build also compiles each one alone, so that a header which
# depends on an earlier include does not build.
function(moka_library name kind)
  cmake_parse_arguments(PARSE_ARGV 2 arg "" "OUTPUT;EXPORT" "SOURCES;HEADERS;PUBLIC;PRIVATE")
  if(kind STREQUAL "LIBRARY" AND BUILD_SHARED_LIBS)
    set(kind SHARED)
  elseif(kind STREQUAL "LIBRARY")
    set(kind STATIC)
  endif()
  add_library(${name} ${kind} ${arg_SOURCES})
  if(kind STREQUAL "SHARED")
    # Loadable on devices with 16 KB pages, such as new Android devices.
    target_link_options(${name} PRIVATE -Wl,-z,max-page-size=16384)
  endif()
  set(scope PUBLIC)
  if(kind STREQUAL "INTERFACE")
    set(scope INTERFACE)
  endif()
  if(arg_HEADERS)
    target_sources(${name} ${scope} FILE_SET HEADERS BASE_DIRS ${PROJECT_SOURCE_DIR} FILES ${arg_HEADERS})
    set_target_properties(${name} PROPERTIES VERIFY_INTERFACE_HEADER_SETS ${PROJECT_IS_TOP_LEVEL})
  endif()
  target_include_directories(${name} ${scope}
    "$<BUILD_INTERFACE:${PROJECT_SOURCE_DIR};${MOKA_GENERATED_HEADERS}>"
    $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>)
  target_compile_features(${name} ${scope} cxx_std_17)
  target_link_libraries(${name} ${scope} ${arg_PUBLIC})
  if(NOT kind STREQUAL "INTERFACE")
    target_link_libraries(${name} PRIVATE $<BUILD_INTERFACE:moka_compile_options> ${arg_PRIVATE})
  endif()
  if(arg_OUTPUT)
    # Installed libraries find each other in their own folder.
    set_target_properties(${name} PROPERTIES
      OUTPUT_NAME ${arg_OUTPUT} VERSION ${PROJECT_VERSION} SOVERSION ${MOKA_SOVERSION} INSTALL_RPATH "\$ORIGIN")
  endif()
  if(arg_EXPORT)
    set_target_properties(${name} PROPERTIES EXPORT_NAME ${arg_EXPORT})
    add_library(Moka::${arg_EXPORT} ALIAS ${name})
    add_library(Moka::${name} ALIAS ${name}) # its earlier name
  endif()
endfunction()

# moka_compile_as_one(NAME FOLDER...)
# Compiles the target's sources in these folders as one source, so that short functions are inlined: recording a rectangle
# takes a fifth less time. Names in anonymous namespaces must be unique across these folders. Debug builds, which the tests
# use, compile each source alone.
function(moka_compile_as_one name)
  if(CMAKE_BUILD_TYPE STREQUAL "Debug")
    return()
  endif()
  get_target_property(directory ${name} SOURCE_DIR)
  get_target_property(sources ${name} SOURCES)
  foreach(source IN LISTS sources)
    cmake_path(ABSOLUTE_PATH source BASE_DIRECTORY ${directory} NORMALIZE)
    cmake_path(GET source PARENT_PATH folder)
    cmake_path(GET folder FILENAME folder)
    if(folder IN_LIST ARGN)
      set_source_files_properties(${source} TARGET_DIRECTORY ${name} PROPERTIES UNITY_GROUP drawing)
    endif()
  endforeach()
  set_target_properties(${name} PROPERTIES UNITY_BUILD ON UNITY_BUILD_MODE GROUP)
  # Each function begins at a cache line. Otherwise a change of one function moves all that follow, and the time to record
  # a rectangle varies by a fifth.
  target_compile_options(${name} PRIVATE -falign-functions=64)
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
