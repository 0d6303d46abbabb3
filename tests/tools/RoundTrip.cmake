# Saves the model a console session builds and rebuilds it from the saved
# script: run the session (going on past failed lines), save; run the saved
# script in a fresh console, which must apply every line, and save again.
# The two saved scripts must be the same and so must the full dumps of both
# models. Arguments: CONSOLE, SESSION (the script, or sessions/default for
# the embedded session), WORK_DIR (where the saved scripts and dumps are
# left), EMULATOR (the command that runs a cross-compiled console, empty
# otherwise), and COMPARE_DUMPS (OFF for a session that leaves dynamic faces
# behind: the dump shows them, the save leaves them out as run-time state).
get_filename_component(name ${SESSION} NAME_WE)
set(prefix ${WORK_DIR}/${name})
set(marker "==== dump ====")
file(WRITE ${prefix}.dump.script "echo ${marker}\ndump\n")

set(script ${SESSION})
set(options)
if(EXISTS ${SESSION})
  file(STRINGS ${SESSION} first_line LIMIT_COUNT 1)
  if(first_line MATCHES "^# options: (.*)$")
    separate_arguments(options UNIX_COMMAND "${CMAKE_MATCH_1}")
  endif()
else()
  set(script ${prefix}.default.script)
  execute_process(COMMAND ${EMULATOR} ${CONSOLE} --print-default OUTPUT_FILE ${script} RESULT_VARIABLE status)
  if(NOT status EQUAL 0)
    message(FATAL_ERROR "--print-default failed: ${status}")
  endif()
endif()

# Runs the console on the script, saving to save, and sets dump to the dump
# of the model it built.
function(run_and_save script save dump)
  execute_process(COMMAND ${EMULATOR} ${CONSOLE} ${ARGN} --save ${save} ${script} ${prefix}.dump.script
                  OUTPUT_VARIABLE out
                  ERROR_VARIABLE err
                  RESULT_VARIABLE status)
  string(FIND "${out}" "${marker}\n" at REVERSE)
  if(at EQUAL -1)
    set(out "")
  else()
    string(SUBSTRING "${out}" ${at} -1 out)
  endif()
  set(${dump} "${out}" PARENT_SCOPE)
  set(status ${status} PARENT_SCOPE)
  set(err "${err}" PARENT_SCOPE)
endfunction()

run_and_save(${script} ${prefix}.1.script first_dump --keep-going ${options})
if(NOT EXISTS ${prefix}.1.script)
  message(FATAL_ERROR "the session's model was not saved (exit status ${status}): ${err}")
endif()
run_and_save(${prefix}.1.script ${prefix}.2.script second_dump)
if(NOT status EQUAL 0 OR NOT err STREQUAL "")
  message(FATAL_ERROR "the saved script did not run cleanly (exit status ${status}):\n${err}")
endif()

# The first line counts the run-time state left out, which only the first
# model holds.
file(READ ${prefix}.1.script first_save)
file(READ ${prefix}.2.script second_save)
string(REGEX REPLACE "^# left out as run-time state:[^\n]*\n" "" first_save "${first_save}")
string(REGEX REPLACE "^# left out as run-time state:[^\n]*\n" "" second_save "${second_save}")
if(NOT first_save STREQUAL second_save)
  execute_process(COMMAND diff -u ${prefix}.1.script ${prefix}.2.script)
  message(FATAL_ERROR "saving the rebuilt model gave another script")
endif()

if(NOT COMPARE_DUMPS)
  return()
endif()
# Registered contacts are run-time state: their blocks are dropped from the
# first dump, each a heading and the deeper-indented lines below it.
set(heading "Dynamic Registered Contacts\n")
string(FIND "${first_dump}" "${heading}" at)
while(at GREATER -1)
  string(SUBSTRING "${first_dump}" 0 ${at} before)
  string(REGEX MATCH " *$" indent "${before}")
  string(LENGTH "${indent}" depth)
  math(EXPR start "${at} - ${depth}")
  string(SUBSTRING "${first_dump}" 0 ${start} before)
  string(LENGTH "${heading}" length)
  math(EXPR after "${at} + ${length}")
  string(SUBSTRING "${first_dump}" ${after} -1 rest)
  string(REGEX MATCH "^(${indent} [^\n]*\n)*" block "${rest}")
  string(LENGTH "${block}" length)
  string(SUBSTRING "${rest}" ${length} -1 rest)
  set(first_dump "${before}${rest}")
  string(FIND "${first_dump}" "${heading}" at)
endwhile()
if(NOT first_dump STREQUAL second_dump)
  file(WRITE ${prefix}.1.dump "${first_dump}")
  file(WRITE ${prefix}.2.dump "${second_dump}")
  execute_process(COMMAND diff -u ${prefix}.1.dump ${prefix}.2.dump)
  message(FATAL_ERROR "the rebuilt model's dump differs from the session's")
endif()
