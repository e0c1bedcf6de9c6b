# SPDX-License-Identifier: Apache-2.0
# The same sources give the same bytes, wherever they lie and whenever they are built: no folder's
# name and no date gets into a program. Not in Debug builds, where a debugger and the counter of
# lines want to find the sources.
add_compile_options(-Wdate-time)
if(NOT CMAKE_BUILD_TYPE STREQUAL Debug)
  add_compile_options(-ffile-prefix-map=${PROJECT_BINARY_DIR}=build -ffile-prefix-map=${PROJECT_SOURCE_DIR}=.)
endif()
