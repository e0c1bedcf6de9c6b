# SPDX-License-Identifier: Apache-2.0
# The same sources give the same bytes, wherever they are and whenever they are built: no folder's name
# and no date gets into a program, not even with debugging records. Debug builds are an exception: a
# debugger and the coverage tool must find the sources.
orvane_accepts(ORVANE_ACCEPTS_DATE_TIME -Wdate-time)
if(ORVANE_ACCEPTS_DATE_TIME)
  add_compile_options(-Wdate-time)
endif()
if(NOT CMAKE_BUILD_TYPE STREQUAL Debug)
  set(map -ffile-prefix-map)
  orvane_accepts(ORVANE_ACCEPTS_FILE_PREFIX_MAP ${map}=here=there)
  if(NOT ORVANE_ACCEPTS_FILE_PREFIX_MAP)
    set(map -fdebug-prefix-map) # GCC before 8; no text of ours contains a file's name
  endif()
  # A compiler may write a folder's name with or without the links in it.
  file(REAL_PATH ${PROJECT_SOURCE_DIR} source)
  file(REAL_PATH ${PROJECT_BINARY_DIR} binary)
  set(names ${map}=${PROJECT_SOURCE_DIR}=. ${map}=${source}=.
    ${map}=${PROJECT_BINARY_DIR}=build ${map}=${binary}=build)
  list(REMOVE_DUPLICATES names)
  add_compile_options(${names})
  # GCC also compiles when it links.
  add_link_options("$<$<CXX_COMPILER_ID:GNU>:${names}>")
endif()
