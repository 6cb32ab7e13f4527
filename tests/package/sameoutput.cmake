# Runs PROGRAM, which must print what the file EXPECTED holds, to the letter.
cmake_minimum_required(VERSION 3.25)

execute_process(COMMAND ${PROGRAM} OUTPUT_VARIABLE output COMMAND_ERROR_IS_FATAL ANY)
file(READ ${EXPECTED} expected)
if(NOT output STREQUAL expected)
  message(FATAL_ERROR "Expected:\n${expected}\nPrinted:\n${output}")
endif()
