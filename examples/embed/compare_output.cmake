# Runs PROGRAM; fails unless it ends with 0 and writes just what the file EXPECTED holds.
execute_process(COMMAND "${PROGRAM}" OUTPUT_VARIABLE output ERROR_VARIABLE errors RESULT_VARIABLE status)
file(READ "${EXPECTED}" expected)
if(NOT status EQUAL 0 OR NOT output STREQUAL expected OR NOT errors STREQUAL "")
  message(FATAL_ERROR "${PROGRAM} ended with ${status}\n--- wrote\n${output}--- expected\n${expected}--- errors\n${errors}")
endif()
