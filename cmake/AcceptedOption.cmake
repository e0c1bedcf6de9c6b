# SPDX-License-Identifier: Apache-2.0
include(CheckCXXCompilerFlag)
include(CheckLinkerFlag)

# Sets RESULT to whether the compiler knows OPTION: the units' compilers are years apart. The test is
# compiled as C++11, the latest standard that the oldest one supports.
function(orvane_accepts result option)
  set(CMAKE_CXX_STANDARD 11)
  check_cxx_compiler_flag(${option} ${result})
endfunction()

# orvane_add_linker_options(TARGET OPTION...): adds each option that the linker accepts for users of
# TARGET. Only the linker of a unit's SDK is asked; a desk's linker that lacks one should fail.
function(orvane_add_linker_options target)
  foreach(option ${ARGN})
    if(CMAKE_CXX_COMPILER_ID STREQUAL QCC)
      string(MAKE_C_IDENTIFIER "ORVANE_LINKS${option}" taken)
      check_linker_flag(CXX LINKER:${option} ${taken})
    else()
      set(taken TRUE)
    endif()
    if(${taken})
      target_link_options(${target} INTERFACE LINKER:${option})
    endif()
  endforeach()
endfunction()
