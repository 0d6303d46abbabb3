# Runs one console session and compares what it printed with what is kept
# beside the script, object addresses aside. Arguments: CONSOLE, SESSION (the script, or
# sessions/default for the embedded session), ACTUAL_DIR (where the output
# of a failing run is left for inspection), and EMULATOR, the command that
# runs the console when it was cross-compiled (empty otherwise).
get_filename_component(directory ${SESSION} DIRECTORY)
get_filename_component(name ${SESSION} NAME_WE)

set(arguments)
if(EXISTS ${SESSION})
  file(STRINGS ${SESSION} first_line LIMIT_COUNT 1)
  if(first_line MATCHES "^# options: (.*)$")
    separate_arguments(arguments UNIX_COMMAND "${CMAKE_MATCH_1}")
  endif()
  get_filename_component(script ${SESSION} NAME)
  list(APPEND arguments ${script})
endif()

execute_process(COMMAND ${EMULATOR} ${CONSOLE} ${arguments}
                WORKING_DIRECTORY ${directory}
                OUTPUT_VARIABLE actual_out
                ERROR_VARIABLE actual_err
                RESULT_VARIABLE status)

# Debug lines carry object addresses, which differ from run to run.
string(REGEX REPLACE "0x[0-9a-f]+" "0x..." actual_out "${actual_out}")

file(READ ${directory}/${name}.out expected_out)
set(expected_err "")
set(expected_status 0)
if(EXISTS ${directory}/${name}.err)
  file(READ ${directory}/${name}.err expected_err)
  set(expected_status 1)
endif()

set(failed FALSE)
foreach(stream out err)
  if(NOT actual_${stream} STREQUAL expected_${stream})
    file(WRITE ${ACTUAL_DIR}/${name}.actual.${stream} "${actual_${stream}}")
    execute_process(COMMAND diff -u ${directory}/${name}.${stream} ${ACTUAL_DIR}/${name}.actual.${stream})
    set(failed TRUE)
  endif()
endforeach()
if(NOT status EQUAL expected_status)
  message(SEND_ERROR "exit status ${status}, expected ${expected_status}")
endif()
if(failed)
  message(FATAL_ERROR "session ${name} printed something else; its output is in ${ACTUAL_DIR}")
endif()
