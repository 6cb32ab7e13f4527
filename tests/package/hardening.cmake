# Reads from PROGRAMS and LIBRARIES, with READELF, how they were built, and fails if one of them lacks a protection that
# a release has. That calls of the C library are checked shows in the programs alone, by the names of what they call
# instead: the libraries hand to it memory of sizes that no compiler knows. One function in cmake/OwnCode.cmake sets all
# of it.
cmake_minimum_required(VERSION 3.25)

# `facts` is what the reader says of the file.
function(expect file facts pattern protection)
  if(NOT facts MATCHES "${pattern}")
    message(SEND_ERROR "${file} is built without ${protection}")
  endif()
endfunction()

function(expect_all file position)
  execute_process(COMMAND ${READELF} --wide --file-header --program-headers --dynamic --dyn-syms ${file}
    OUTPUT_VARIABLE facts COMMAND_ERROR_IS_FATAL ANY)
  expect(${file} "${facts}" "${position}" "a position that is chosen when it is loaded")
  expect(${file} "${facts}" "GNU_RELRO" "read-only relocations")
  expect(${file} "${facts}" "\\(FLAGS(_1)?\\)[^\n]*NOW" "the binding of all names at its start")
  expect(${file} "${facts}" "GNU_STACK( +0x[0-9a-f]+)+ +RW " "a stack that can't be executed")
  expect(${file} "${facts}" "__stack_chk_fail" "the stack protector")
  set(facts "${facts}" PARENT_SCOPE)
endfunction()

if(NOT PROGRAMS AND NOT LIBRARIES)
  message(FATAL_ERROR "There is nothing to look at")
endif()
foreach(file IN LISTS PROGRAMS)
  expect_all(${file} "\\(FLAGS_1\\)[^\n]*PIE")
  expect(${file} "${facts}" "__(memcpy|v?snprintf)_chk" "_FORTIFY_SOURCE")
endforeach()
foreach(file IN LISTS LIBRARIES)
  expect_all(${file} "Type: +DYN")
endforeach()
