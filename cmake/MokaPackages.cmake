# Debian packages, one for each component that is installed (MokaInstall.cmake). scripts/package makes them.
set(runtime libmokagraphics${MOKA_SOVERSION})
set(exactly "${runtime} (= ${PROJECT_VERSION}-1)")

set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME moka-graphics)
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_PACKAGING_INSTALL_PREFIX ${CMAKE_INSTALL_PREFIX})
set(CPACK_STRIP_FILES ON)
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_COMPONENTS_GROUPING IGNORE)
set(CPACK_COMPONENTS_ALL MokaRuntime MokaDevelopment MokaTool)
if(TARGET moka_java_sdk)
  list(APPEND CPACK_COMPONENTS_ALL MokaJava)
endif()
if(TARGET moka_notebook)
  list(APPEND CPACK_COMPONENTS_ALL MokaNotebook)
endif()

set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
# The folder of the libraries that other packages of this project contain.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS "")
foreach(folder base renderer/gles graphics host)
  list(APPEND CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${PROJECT_BINARY_DIR}/moka/${folder})
endforeach()

# moka_package(COMPONENT NAME SECTION DEPENDS SUMMARY LINE...)
macro(moka_package component name section depends)
  string(TOUPPER ${component} upper)
  set(CPACK_DEBIAN_${upper}_PACKAGE_NAME ${name})
  set(CPACK_DEBIAN_${upper}_PACKAGE_SECTION ${section})
  set(CPACK_DEBIAN_${upper}_PACKAGE_DEPENDS "${depends}")
  string(JOIN "\n" CPACK_DEBIAN_${upper}_DESCRIPTION ${ARGN})
endmacro()
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "") # each has its own
moka_package(MokaRuntime ${runtime} libs ""
  "2D GPU graphics library of a pen-and-note platform"
  "Bitmaps of any height on the GPU, and canvases that any thread may draw on"
  "while one render thread owns the OpenGL ES context.")
moka_package(MokaDevelopment libmokagraphics-dev libdevel "${exactly}"
  "2D GPU graphics library, development files"
  "Headers, CMake and pkg-config files of libMokaGraphics, and the archives that"
  "stand for it where there is no driver.")
moka_package(MokaTool moka graphics "${exactly}"
  "convert, draw and inspect images on the GPU"
  "The command-line tool of libMokaGraphics: images between PNG, JPEG, WebP and"
  "mki, scenes in JSON, and a gallery of what the library draws.")
moka_package(MokaJava libmokagraphics-java java "${exactly}"
  "2D GPU graphics library, Java classes"
  "The classes that libMokaGraphics registers its natives with, for Java programs"
  "that load it.")
moka_package(MokaNotebook moka-notebook graphics "${exactly}"
  "notebook page to write on with a pen, a finger or the mouse"
  "Pens, a highlighter, erasers, a lasso and images on a page as long as it is"
  "written, drawn on the GPU by libMokaGraphics and kept as a scene in JSON.")
set(CPACK_DEBIAN_MOKARUNTIME_PACKAGE_RECOMMENDS "libegl-mesa0, libgl1-mesa-dri")
set(CPACK_DEBIAN_MOKADEVELOPMENT_PACKAGE_RECOMMENDS "cmake (>= 3.23), pkg-config")
set(CPACK_DEBIAN_MOKAJAVA_PACKAGE_RECOMMENDS "default-jre-headless")

set(CPACK_DEBIAN_MOKARUNTIME_PACKAGE_CONTROL_EXTRA
  ${PROJECT_BINARY_DIR}/debian/symbols ${PROJECT_SOURCE_DIR}/debian/triggers)
set(CPACK_PRE_BUILD_SCRIPTS ${PROJECT_SOURCE_DIR}/cmake/FinishPackages.cmake)
set(CPACK_PROJECT_CONFIG_FILE ${PROJECT_BINARY_DIR}/debian/CPackValues.cmake)
file(CONFIGURE OUTPUT ${CPACK_PROJECT_CONFIG_FILE} @ONLY CONTENT "# What FinishPackages.cmake needs to know.
set(MOKA_SOURCE_DIR [[@PROJECT_SOURCE_DIR@]])
set(MOKA_BINARY_DIR [[@PROJECT_BINARY_DIR@]])
set(MOKA_LIBDIR [[@CMAKE_INSTALL_LIBDIR@]])
set(MOKA_SOVERSION [[@MOKA_SOVERSION@]])
set(MOKA_READELF [[@CMAKE_READELF@]])
set(MOKA_NM [[@CMAKE_NM@]])
set(MOKA_STRIP [[@CMAKE_STRIP@]])
")
include(CPack)
