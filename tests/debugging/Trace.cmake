# A drawing's trace is JSON, and can be drawn, also when it lacks its end; one that cannot be written spoils no picture.
cmake_policy(VERSION 3.25)
file(REMOVE_RECURSE ${FOLDER})
file(MAKE_DIRECTORY ${FOLDER})

# draw(EXPECTED_STATUS TEXT ARGUMENTS ...): TEXT is what is to be said on stderr.
function(draw expected text)
  execute_process(COMMAND ${MOKA} draw ${SCENE} -o ${FOLDER}/out.png ${ARGN} WORKING_DIRECTORY ${FOLDER}
    RESULT_VARIABLE status OUTPUT_QUIET ERROR_VARIABLE said)
  if(NOT status EQUAL expected OR NOT said MATCHES "${text}")
    message(FATAL_ERROR "moka draw ${ARGN} ends with ${status} instead of ${expected}, and says: ${said}")
  endif()
endfunction()

# expect_in(FILE TEXT ...)
function(expect_in file)
  file(READ ${file} content)
  foreach(text IN LISTS ARGN)
    if(NOT content MATCHES "${text}")
      message(FATAL_ERROR "${file} has no ${text}")
    endif()
  endforeach()
endfunction()

function(picture trace)
  execute_process(COMMAND ${PYTHON} ${SCRIPT} ${trace} -o ${FOLDER}/trace.svg COMMAND_ERROR_IS_FATAL ANY)
  expect_in(${FOLDER}/trace.svg "moka-render" "WaitForTasks" "Flush \\(draws [0-9]+, runs [0-9]+\\)")
endfunction()

draw(0 "^$" --trace trace.json)
file(READ ${FOLDER}/trace.json json)
string(JSON events LENGTH "${json}") # stops on what is no JSON
if(events LESS 20)
  message(FATAL_ERROR "only ${events} events")
endif()
expect_in(${FOLDER}/trace.json "\"save\".*\"format\":\"png\",\"width\":240,\"height\":660" "open the context")
picture(${FOLDER}/trace.json)
string(REGEX REPLACE "\n]\n$" "" cut "${json}")
file(WRITE ${FOLDER}/cut.json "${cut}")
picture(${FOLDER}/cut.json)

set(ENV{MOKA_TRACE} ${FOLDER}/by-environment.json)
draw(0 "^$")
expect_in(${FOLDER}/by-environment.json "\"Flush\"" "\n]\n$")
unset(ENV{MOKA_TRACE})

file(REMOVE ${FOLDER}/out.png)
draw(1 "^[^\n]*cannot write the trace nowhere/trace.json: [^\n]*\n$" --trace nowhere/trace.json)
if(NOT EXISTS ${FOLDER}/out.png)
  message(FATAL_ERROR "no picture where the trace fails")
endif()
draw(2 "cannot both be" --trace ${FOLDER}/out.png)
draw(2 "name of a file" --trace -)
