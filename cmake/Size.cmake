# SPDX-License-Identifier: Apache-2.0
# The product's size. Beyond its calls, a run costs the pages that it touches, so small code is fast code
# here (docs/performance.md has the figures).
add_library(orvane_size INTERFACE)
if(NOT CMAKE_BUILD_TYPE STREQUAL Debug)
  target_compile_options(orvane_size INTERFACE -Os -ffunction-sections -fdata-sections)
  orvane_add_linker_options(orvane_size --gc-sections)
endif()

# Optimisation at the link saves a tenth of the code: functions with one caller are inlined there. Only
# GCC does it here; its objects also keep their machine code, for other programs and for tests. The unit's
# SDK does not: CMake's rules for its driver (QCC) have no such optimisation, and it is not worth asking
# for by hand. Measured with the ARM compiler for Linux: with the C++ library linked statically, as for a
# unit, the code shrinks by 2.3 KB, but alignment keeps the file at 341,832 bytes; it runs 0.4 % fewer
# instructions. With a dynamic library the file is 30,348 bytes instead of 34,444 and runs 0.3 % fewer:
# an all-dynamic program without the optimisation is above the limit of 32 KiB, which the Linux build
# meets.
if(CMAKE_CXX_COMPILER_ID STREQUAL GNU AND NOT CMAKE_BUILD_TYPE STREQUAL Debug)
  include(CheckIPOSupported)
  check_ipo_supported(RESULT ORVANE_LINK_TIME_OPTIMISATION OUTPUT ignored LANGUAGES CXX)
  if(ORVANE_LINK_TIME_OPTIMISATION)
    target_compile_options(orvane_size INTERFACE -ffat-lto-objects)
  endif()
endif()

function(orvane_optimise_at_link)
  set_target_properties(${ARGN} PROPERTIES
    INTERPROCEDURAL_OPTIMIZATION "${ORVANE_LINK_TIME_OPTIMISATION}")
endfunction()
