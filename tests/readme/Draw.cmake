# Runs the README's program, README, and has CHECK look at the picture it has written into FOLDER.
set(picture ${FOLDER}/drawn.png)
file(REMOVE ${picture})
execute_process(COMMAND ${README} ${picture} COMMAND_ERROR_IS_FATAL ANY)
execute_process(COMMAND ${CHECK} ${picture} COMMAND_ERROR_IS_FATAL ANY)
