# Compiles and packs the Java sources with the tools of a JDK, if there is one.
find_package(Java 11 QUIET COMPONENTS Runtime Development)

# Compiles for Java 11, because the VM may be older than javac.
set(MOKA_JAVAC ${Java_JAVAC_EXECUTABLE} --release 11 -encoding UTF-8 -Xlint:all -Werror)

# moka_jar(NAME OUTPUT file SOURCES ... [OPTIONS ...] [JARS ...] [RULES file]): the target NAME makes the jar,
# and its property MOKA_JAR is the path. JARS are targets of this function to compile against. RULES are keep rules; the jar
# has them in the folder in which Android's tools find them.
function(moka_jar name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "OUTPUT;RULES" "SOURCES;OPTIONS;JARS")
  set(jar ${CMAKE_CURRENT_BINARY_DIR}/${arg_OUTPUT})
  set(classes ${CMAKE_CURRENT_BINARY_DIR}/${name}.classes)
  set(jars "")
  foreach(other IN LISTS arg_JARS)
    get_target_property(path ${other} MOKA_JAR)
    list(APPEND jars ${path})
  endforeach()
  list(JOIN jars ":" classPath)
  list(TRANSFORM arg_SOURCES PREPEND ${CMAKE_CURRENT_SOURCE_DIR}/)
  set(copyRules "")
  if(arg_RULES)
    set(arg_RULES ${CMAKE_CURRENT_SOURCE_DIR}/${arg_RULES})
    set(folder ${classes}/META-INF/proguard)
    set(copyRules COMMAND ${CMAKE_COMMAND} -E make_directory ${folder}
      COMMAND ${CMAKE_COMMAND} -E copy ${arg_RULES} ${folder}/${name}.pro)
  endif()
  add_custom_command(OUTPUT ${jar} VERBATIM
    # Removes classes whose sources were deleted.
    COMMAND ${CMAKE_COMMAND} -E rm -rf ${classes}
    COMMAND ${MOKA_JAVAC} ${arg_OPTIONS} -classpath "${classPath}" -d ${classes} ${arg_SOURCES}
    ${copyRules}
    COMMAND ${Java_JAR_EXECUTABLE} --create --file ${jar} -C ${classes} .
    DEPENDS ${arg_SOURCES} ${arg_RULES} ${jars}
    COMMENT "Packing ${arg_OUTPUT}")
  add_custom_target(${name} ALL DEPENDS ${jar})
  set_target_properties(${name} PROPERTIES MOKA_JAR ${jar})
endfunction()
