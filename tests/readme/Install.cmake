# Installs BUILD into FOLDER, builds SOURCE with GENERATOR and find_package(MokaGraphics), runs it,
# and has CHECK look at the picture.
set(project ${FOLDER}/project)
file(REMOVE_RECURSE ${FOLDER}/installed ${project})
file(MAKE_DIRECTORY ${project})
file(WRITE ${project}/CMakeLists.txt "
cmake_minimum_required(VERSION 3.25)
project(User CXX)
find_package(MokaGraphics 0.1 REQUIRED COMPONENTS Graphics Host)
add_executable(user ${SOURCE})
target_link_libraries(user PRIVATE Moka::Graphics Moka::Host)
")
macro(run)
  execute_process(COMMAND ${ARGN} OUTPUT_VARIABLE output ERROR_VARIABLE output RESULT_VARIABLE result)
  if(NOT result EQUAL 0)
    message(FATAL_ERROR "${ARGN}: ${result}\n${output}")
  endif()
endmacro()
run(${CMAKE_COMMAND} --install ${BUILD} --prefix ${FOLDER}/installed)
run(${CMAKE_COMMAND} -G ${GENERATOR} -S ${project} -B ${project}/build
  -DCMAKE_PREFIX_PATH=${FOLDER}/installed)
run(${CMAKE_COMMAND} --build ${project}/build)
run(${project}/build/user ${project}/drawn.png)
run(${CHECK} ${project}/drawn.png)
