# SPDX-License-Identifier: Apache-2.0
# The product's size. What a run costs beyond the calls it makes are the pages that it touches, so
# small code is the fast code here (docs/performance.md has the figures).
add_library(orvane_size INTERFACE)
if(NOT CMAKE_BUILD_TYPE STREQUAL Debug)
  target_compile_options(orvane_size INTERFACE -Os -ffunction-sections -fdata-sections)
  orvane_add_linker_options(orvane_size --gc-sections)
endif()

# Optimised at the link, too, a tenth of the code goes: what has one caller is inlined there. By GCC,
# whose objects keep their machine code beside what the link reads, for other programs and for tests.
# Not by the unit's SDK: CMake's rules for its driver (QCC) have no such optimisation, and it is not
# worth asking for by hand. Measured with the ARM compiler for Linux: with the C++ library linked
# statically, as for a unit, the code shrinks by 2.3 KB, but alignment keeps the file at 341,832 bytes;
# it runs 0.4 % fewer instructions. With a dynamic one it has 30,348 bytes instead of 34,444 and runs
# 0.3 % fewer: an all-dynamic program without it is above the bar of 32 KiB, which is held by the Linux
# build.
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
