# cmake --install runs this first. It fails with one line if the prefix is not writable.
set(folder "$ENV{DESTDIR}${CMAKE_INSTALL_PREFIX}")
execute_process(COMMAND ${CMAKE_COMMAND} -E make_directory "${folder}" RESULT_VARIABLE result ERROR_QUIET)
if(result EQUAL 0)
  execute_process(COMMAND test -w "${folder}" RESULT_VARIABLE result)
endif()
if(NOT result EQUAL 0)
  message(FATAL_ERROR "cannot write to the prefix ${folder}: choose another with --prefix, or run as root")
endif()
