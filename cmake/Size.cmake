# SPDX-License-Identifier: Apache-2.0
# The product's size. What a run costs beyond the calls it makes are the pages that it touches, so
# small code is the fast code here (docs/performance.md has the figures).
add_library(orvane_size INTERFACE)
if(NOT CMAKE_BUILD_TYPE STREQUAL Debug)
  target_compile_options(orvane_size INTERFACE -Os -ffunction-sections -fdata-sections)
  target_link_options(orvane_size INTERFACE LINKER:--gc-sections)
endif()

# Optimised at the link, too, a tenth of the code goes: what has one caller is inlined there. By GCC
# (as the unit's SDK has it, also when CMake calls it QCC), whose objects keep their machine code
# beside what the link reads, for other programs and for tests.
if(CMAKE_CXX_COMPILER_ID MATCHES "GNU|QCC" AND NOT CMAKE_BUILD_TYPE STREQUAL Debug)
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
