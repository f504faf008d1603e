# Runs the README's program, README, and has MOKA draw the same from SCENE: the pictures, in FOLDER, must be equal.
set(drawn ${FOLDER}/drawn.png)
set(expected ${FOLDER}/expected.png)
file(REMOVE ${drawn} ${expected})
execute_process(COMMAND ${README} ${drawn} COMMAND_ERROR_IS_FATAL ANY)
execute_process(COMMAND ${MOKA} draw ${SCENE} -o ${expected} COMMAND_ERROR_IS_FATAL ANY)
execute_process(COMMAND ${CMAKE_COMMAND} -E compare_files ${drawn} ${expected} COMMAND_ERROR_IS_FATAL ANY)
