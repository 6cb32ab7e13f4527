# Holds what LIBRARY exports against the classes that are its interface: nothing but their members, and something of
# each.
cmake_minimum_required(VERSION 3.25)

set(exportedClasses
    BINAttributeResults
    BINAttributeTargetResults
    BINCatNumEncoder
    BINCatVar
    BINContVar
    BINFactory
    BINNumericInterval
    BINNumericUserMissing
    BINOutput
    BINProgressReporter
    BINRoundEncoder
    BINSettings
    BINStringEncoder
    BINStringInterval
    BINStringUserMissing
    BINVarList
    BINVariable
    BINWeightVar
    EFBINFactory
    EFBINOutput
    EFBINSettings
    IBINAlgorithm
    IBINEncoder
    IBINUserMissing
    IBINVariable
    IEFBINAlgorithm
    MCBinning::MCStatus)

execute_process(COMMAND ${NM} -DC --defined-only ${LIBRARY} OUTPUT_VARIABLE output COMMAND_ERROR_IS_FATAL ANY)
string(REGEX MATCHALL "[^\n]+" lines "${output}")

set(missing ${exportedClasses})
foreach(line IN LISTS lines)
  string(REGEX REPLACE "^[0-9a-f]+ [A-Za-z] " "" symbol "${line}")
  string(REGEX MATCH "^((vtable|typeinfo|typeinfo name) for )?((MCBinning::)?[A-Za-z]+)(::|$)" ignored "${symbol}")
  if(CMAKE_MATCH_3 IN_LIST exportedClasses)
    list(REMOVE_ITEM missing ${CMAKE_MATCH_3})
  else()
    string(APPEND foreign "\n  ${symbol}")
  endif()
endforeach()

if(foreign)
  message(SEND_ERROR "Exported, and of no exported class:${foreign}")
endif()
if(missing)
  message(SEND_ERROR "Without an exported member: ${missing}")
endif()
