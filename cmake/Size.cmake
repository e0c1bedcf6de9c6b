# SPDX-License-Identifier: Apache-2.0
# The product's size. What a run costs beyond the calls it makes are the pages that it touches, so
# small code is the fast code here (docs/performance.md has the figures).
add_library(orvane_size INTERFACE)
if(NOT CMAKE_BUILD_TYPE STREQUAL Debug)
  target_compile_options(orvane_size INTERFACE -Os -ffunction-sections -fdata-sections)
  target_link_options(orvane_size INTERFACE LINKER:--gc-sections)
  # A tenth of the code: what is inlined into its one caller goes from where it was defined.
  include(CheckIPOSupported)
  check_ipo_supported(RESULT ORVANE_LINK_TIME_OPTIMISATION OUTPUT ignored LANGUAGES CXX)
  # Objects keep their machine code beside what the link reads: tests look into it.
  target_compile_options(orvane_size INTERFACE $<$<CXX_COMPILER_ID:GNU>:-ffat-lto-objects>)
endif()

function(orvane_optimise_at_link)
  set_target_properties(${ARGN} PROPERTIES
    INTERPROCEDURAL_OPTIMIZATION "${ORVANE_LINK_TIME_OPTIMISATION}")
endfunction()
