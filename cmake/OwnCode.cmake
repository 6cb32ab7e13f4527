# What holds for the code of this project: its warnings and the sanitizers of a test build, which are never a user's,
# and the hardening of a release, which a project that takes in the sources has to ask for.
include(CheckCXXSourceCompiles)
include(CheckLinkerFlag)
include(CheckPIESupported)

# Level 3 also checks against sizes that are known at run time only. Where the compiler or the C library doesn't have
# it, the latter warns and falls back on level 2.
function(mcobnqrt_find_fortify_level)
  set(CMAKE_REQUIRED_FLAGS "-O2 -Werror -U_FORTIFY_SOURCE -D_FORTIFY_SOURCE=3")
  check_cxx_source_compiles("#include <cstdio>\nint main() { return std::puts(\"\"); }" MCOBNQRT_HAS_FORTIFY_3)
endfunction()

# Which of the linker's protections there are: they are those of ELF.
function(mcobnqrt_find_linker_protections)
  check_linker_flag(CXX LINKER:-z,relro,-z,now MCOBNQRT_HAS_RELRO)
endfunction()

# Hardens the optimised builds of the target: checks of the C library's calls where the size of a buffer is known, a
# guard value ahead of each return address that an array could overwrite, no table of addresses that can be written once
# the program has started, and a program that can be loaded at any address. Sanitizers see the same faults and more, and
# don't go with it.
function(mcobnqrt_harden target)
  if(NOT MCOBNQRT_HARDENING OR MCOBNQRT_SANITIZE)
    return()
  endif()
  set(isOptimised $<CONFIG:Release,RelWithDebInfo,MinSizeRel>)
  mcobnqrt_find_fortify_level()
  set(level $<IF:$<BOOL:${MCOBNQRT_HAS_FORTIFY_3}>,3,2>)
  target_compile_options(${target} PRIVATE
    $<${isOptimised}:-U_FORTIFY_SOURCE> $<${isOptimised}:-D_FORTIFY_SOURCE=${level}> $<${isOptimised}:-fstack-protector-strong>)
  mcobnqrt_find_linker_protections()
  if(MCOBNQRT_HAS_RELRO)
    target_link_options(${target} PRIVATE $<${isOptimised}:LINKER:-z,relro,-z,now>)
  endif()
  get_target_property(isAnyPosition ${target} POSITION_INDEPENDENT_CODE)
  if(NOT isAnyPosition) # CMake makes a program of such code one that can be loaded anywhere, where the linker can
    check_pie_supported(LANGUAGES CXX)
    set_target_properties(${target} PROPERTIES POSITION_INDEPENDENT_CODE ON)
  endif()
endfunction()

function(mcobnqrt_own_code target)
  mcobnqrt_harden(${target})
  if(NOT PROJECT_IS_TOP_LEVEL)
    return()
  endif()
  target_compile_options(${target} PRIVATE -Wall -Wextra -Wpedantic -Wconversion -Wshadow)
  if(MCOBNQRT_WERROR)
    target_compile_options(${target} PRIVATE -Werror)
  endif()
  if(MCOBNQRT_SANITIZE)
    target_compile_options(${target} PRIVATE -fsanitize=${MCOBNQRT_SANITIZE} -fno-sanitize-recover=all
                                             -fno-omit-frame-pointer)
    target_link_options(${target} PRIVATE -fsanitize=${MCOBNQRT_SANITIZE})
  endif()
endfunction()
