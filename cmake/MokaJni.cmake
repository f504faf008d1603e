# Finds the folders of a JDK's jni.h and sets MOKA_JNI_HEADERS; empty without a JDK. This tree and installed packages use it.
function(moka_find_jni result)
  # CMake's search does not find JDKs that are newer than CMake, so pass it the folder of javac.
  find_package(Java QUIET COMPONENTS Development)
  if(Java_JAVAC_EXECUTABLE AND NOT DEFINED JAVA_HOME)
    file(REAL_PATH ${Java_JAVAC_EXECUTABLE} javac)
    cmake_path(GET javac PARENT_PATH JAVA_HOME)
    cmake_path(GET JAVA_HOME PARENT_PATH JAVA_HOME)
  endif()
  find_package(JNI QUIET COMPONENTS JVM)
  set(headers "")
  # Checks the headers only, because the package's result also requires the VM.
  if(JAVA_INCLUDE_PATH AND JAVA_INCLUDE_PATH2)
    set(headers ${JAVA_INCLUDE_PATH} ${JAVA_INCLUDE_PATH2})
  endif()
  set(${result} ${headers} PARENT_SCOPE)
endfunction()

moka_find_jni(MOKA_JNI_HEADERS)
