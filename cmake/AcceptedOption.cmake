# SPDX-License-Identifier: Apache-2.0
include(CheckCXXCompilerFlag)

# Sets RESULT to whether the compiler knows OPTION: the units' compilers are years apart. Asked in
# C++11, the latest that the oldest one has.
function(orvane_accepts result option)
  set(CMAKE_CXX_STANDARD 11)
  check_cxx_compiler_flag(${option} ${result})
endfunction()
