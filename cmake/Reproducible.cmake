# SPDX-License-Identifier: Apache-2.0
# The same sources give the same bytes, wherever they lie and whenever they are built: no folder's
# name and no date gets into a program. Not in Debug builds, where a debugger and the counter of
# lines want to find the sources.
add_compile_options(
  $<$<NOT:$<CONFIG:Debug>>:-ffile-prefix-map=${PROJECT_BINARY_DIR}=build>
  $<$<NOT:$<CONFIG:Debug>>:-ffile-prefix-map=${PROJECT_SOURCE_DIR}=.>
  -Wdate-time)
