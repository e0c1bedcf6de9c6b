# SPDX-License-Identifier: Apache-2.0
# The product's size, as an interface target. What a run costs beyond the calls it makes are the
# pages that it touches, so small code is the fast code here (docs/performance.md has the figures).
add_library(orvane_size INTERFACE)
if(NOT CMAKE_BUILD_TYPE STREQUAL Debug)
  target_compile_options(orvane_size INTERFACE -Os -ffunction-sections -fdata-sections)
  target_link_options(orvane_size INTERFACE LINKER:--gc-sections)
endif()
