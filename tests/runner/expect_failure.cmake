cmake_minimum_required(VERSION 3.25)
# Runs PROGRAM with ARGS (separated by |), under EMULATOR if one is given, and checks
# the exit code, the message and that nothing crashed. Used by the runner's
# error-handling tests.
string(REPLACE "|" ";" ARGS "${ARGS}")
string(REPLACE "|" ";" EMULATOR "${EMULATOR}")
execute_process(COMMAND ${EMULATOR} ${PROGRAM} ${ARGS} RESULT_VARIABLE code OUTPUT_VARIABLE out ERROR_VARIABLE err)
set(all "${out}${err}")
if(NOT code STREQUAL "${EXIT_CODE}")
  message(FATAL_ERROR "expected exit code ${EXIT_CODE}, got ${code}\n${all}")
endif()
if(NOT all MATCHES "${REGEX}")
  message(FATAL_ERROR "the output does not match\n  ${REGEX}\nit was:\n${all}")
endif()
if(all MATCHES "terminate called|Segmentation|Aborted|AddressSanitizer|stack trace")
  message(FATAL_ERROR "the runner crashed:\n${all}")
endif()
