# Finds the folders of a JDK's jni.h: MOKA_JNI_HEADERS, empty without a JDK. Used here and by installed packages.
function(moka_find_jni result)
  # CMake's own search misses JDKs younger than it, so it is told where javac lies.
  find_package(Java QUIET COMPONENTS Development)
  if(Java_JAVAC_EXECUTABLE AND NOT DEFINED JAVA_HOME)
    file(REAL_PATH ${Java_JAVAC_EXECUTABLE} javac)
    cmake_path(GET javac PARENT_PATH JAVA_HOME)
    cmake_path(GET JAVA_HOME PARENT_PATH JAVA_HOME)
  endif()
  find_package(JNI QUIET COMPONENTS JVM)
  set(headers "")
  # By the headers, which is all that is needed: the package also asks for the VM.
  if(JAVA_INCLUDE_PATH AND JAVA_INCLUDE_PATH2)
    set(headers ${JAVA_INCLUDE_PATH} ${JAVA_INCLUDE_PATH2})
  endif()
  set(${result} ${headers} PARENT_SCOPE)
endfunction()

moka_find_jni(MOKA_JNI_HEADERS)
