# SPDX-License-Identifier: Apache-2.0
# The same sources give the same bytes, wherever they lie and whenever they are built: no folder's
# name and no date gets into a program, not even with debugging records. Not in Debug builds, where a
# debugger and the counter of lines want to find the sources.
add_compile_options(-Wdate-time)
if(NOT CMAKE_BUILD_TYPE STREQUAL Debug)
  set(names -ffile-prefix-map=${PROJECT_SOURCE_DIR}=. -ffile-prefix-map=${PROJECT_BINARY_DIR}=build)
  add_compile_options(${names})
  # GCC's link compiles, too.
  add_link_options("$<$<CXX_COMPILER_ID:GNU>:${names}>")
endif()
