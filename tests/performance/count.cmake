# Counts what PROGRAM does for WORKLOAD, at a part of its size, and compares it with INSTRUCTIONS and CALLS, the stored
# figures.
cmake_minimum_required(VERSION 3.25)

execute_process(COMMAND ${VALGRIND} --quiet --tool=callgrind --callgrind-out-file=${PROFILE}
  --compress-strings=no --compress-pos=no ${PROGRAM} ${WORKLOAD} ${SCALE} COMMAND_ERROR_IS_FATAL ANY)

# A profile names each object file ahead of what was done in it. A line of digits is a line of source and what it cost;
# that behind "calls" is what was done by the callee, which has a line of its own, too. "cob" names the callee's object
# if it is another.
file(STRINGS ${PROFILE} lines REGEX "^(ob=|cob=|calls=|[0-9])")
set(instructions 0)
set(calls 0)
set(isOurs FALSE)
set(isCallee FALSE)
set(isCallOut FALSE)
foreach(line IN LISTS lines)
  if(line MATCHES "^ob=")
    string(FIND "${line}" "/libMCOBNQRT.so" found)
    if(found EQUAL -1)
      set(isOurs FALSE)
    else()
      set(isOurs TRUE)
    endif()
  elseif(NOT isOurs)
    continue()
  elseif(line MATCHES "^cob=")
    set(isCallOut TRUE)
  elseif(line MATCHES "^calls=([0-9]+)")
    if(isCallOut)
      math(EXPR calls "${calls} + ${CMAKE_MATCH_1}")
    endif()
    set(isCallOut FALSE)
    set(isCallee TRUE)
  elseif(isCallee)
    set(isCallee FALSE)
  elseif(line MATCHES "^[0-9]+ ([0-9]+)$")
    math(EXPR instructions "${instructions} + ${CMAKE_MATCH_1}")
  endif()
endforeach()

# More is a loss, less is a gain to be kept: either way the figure is no longer that of the library.
function(compare what count stored)
  message(STATUS "${WORKLOAD}: ${count} ${what}, stored ${stored}")
  math(EXPR difference "${count} - ${stored}")
  math(EXPR room "${stored} / 20")
  if(difference GREATER room)
    message(SEND_ERROR "${WORKLOAD} takes over 5 % more ${what} than it did: ${count} instead of ${stored}")
  elseif(difference LESS -${room})
    message(SEND_ERROR "${WORKLOAD} takes over 5 % less ${what} than it did: ${count} instead of ${stored}. Store the new figure")
  endif()
endfunction()

compare("instructions" ${instructions} ${INSTRUCTIONS})
compare("calls out of the library" ${calls} ${CALLS})
