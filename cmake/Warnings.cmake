# SPDX-License-Identifier: Apache-2.0
# The warnings for our own code, as an interface target: third-party sources don't get them.
add_library(orvane_warnings INTERFACE)
# The unit's compilers may be older than half of these warnings, and fail at an option that they don't
# know. The desk's compilers check these sources with all warnings.
if(CMAKE_CXX_COMPILER_ID STREQUAL QCC)
  target_compile_options(orvane_warnings INTERFACE -Wall -Wextra)
  return()
endif()
target_compile_options(orvane_warnings INTERFACE
  -Wall -Wextra -Wpedantic -Wconversion -Wsign-conversion -Wshadow -Wold-style-cast -Wcast-align
  -Wcast-qual -Wundef -Wnon-virtual-dtor -Woverloaded-virtual
  -Wdouble-promotion -Wformat=2 -Wimplicit-fallthrough -Wswitch-enum -Wunused)
if(CMAKE_CXX_COMPILER_ID STREQUAL GNU)
  target_compile_options(orvane_warnings INTERFACE
    -Wduplicated-cond -Wduplicated-branches -Wlogical-op)
endif()
