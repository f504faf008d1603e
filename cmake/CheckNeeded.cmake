# CheckNeeded: fails the build if a shared library needs a library that is not allowed, or imports GL or EGL functions.
# cmake -DLIBRARY=file -DALLOWED="name;name" -DREADELF=... -DNM=... -P CheckNeeded.cmake
# Beyond ALLOWED (file names without version) only the C++ runtime and sanitizer runtimes are accepted.
cmake_policy(VERSION 3.25)

set(runtime libstdc++ libc++ libc++_shared libc++abi libgcc_s libm libc libpthread libdl ld-linux-x86-64 ld-linux-aarch64
  libasan libubsan libtsan)

execute_process(COMMAND ${READELF} -d ${LIBRARY} OUTPUT_VARIABLE dynamic COMMAND_ERROR_IS_FATAL ANY)
string(REGEX MATCHALL "\\(NEEDED\\)[^\n]*\\[[^\n]*\\]" entries "${dynamic}")
if(NOT entries)
  message(FATAL_ERROR "${LIBRARY}: no needed libraries found; is ${READELF} working?")
endif()
foreach(entry IN LISTS entries)
  string(REGEX REPLACE ".*\\[(.*)\\]" "\\1" file "${entry}")
  string(REGEX REPLACE "\\.so.*" "" name "${file}")
  if(NOT name IN_LIST ALLOWED AND NOT name IN_LIST runtime)
    message(FATAL_ERROR "${LIBRARY} needs ${file}; it may need only ${ALLOWED} and the C++ runtime.")
  endif()
endforeach()

execute_process(COMMAND ${NM} -D --undefined-only ${LIBRARY} OUTPUT_VARIABLE undefined COMMAND_ERROR_IS_FATAL ANY)
string(REGEX MATCH "U (gl[A-Z][A-Za-z0-9]*|egl[A-Z][A-Za-z0-9]*)" direct "${undefined}")
if(direct)
  message(FATAL_ERROR "${LIBRARY} calls ${CMAKE_MATCH_1} itself; GL belongs in moka/renderer/gles, EGL in moka/host.")
endif()
