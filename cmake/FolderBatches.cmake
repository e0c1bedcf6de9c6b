# SPDX-License-Identifier: Apache-2.0
# For clang-tidy, which looks at the headers of the system and of the libraries again for every source:
# that takes most of its time. The sources of a folder are one batch, read with one look at their
# headers. Such a build is never run.
option(ORVANE_BATCHES "Compile the sources of a folder as one, for clang-tidy" OFF)

# orvane_batch_by_folder(TARGET [ALONE SOURCE...]): the sources of TARGET, but those that are to stay
# alone, since they have a name of their own that another source of their folder has, too.
function(orvane_batch_by_folder target)
  if(NOT ORVANE_BATCHES)
    return()
  endif()
  cmake_parse_arguments(PARSE_ARGV 1 given "" "" ALONE)
  get_target_property(sources ${target} SOURCES)
  foreach(source IN LISTS sources)
    cmake_path(ABSOLUTE_PATH source)
    cmake_path(GET source PARENT_PATH folder)
    cmake_path(RELATIVE_PATH folder BASE_DIRECTORY ${PROJECT_SOURCE_DIR})
    string(MAKE_C_IDENTIFIER ${folder} group)
    set_source_files_properties(${source} PROPERTIES UNITY_GROUP ${group})
  endforeach()
  set_source_files_properties(${given_ALONE} PROPERTIES SKIP_UNITY_BUILD_INCLUSION ON)
  set_target_properties(${target} PROPERTIES UNITY_BUILD ON UNITY_BUILD_MODE GROUP)
  # The static analyzer follows what a batch includes only when it is told to.
  target_compile_options(${target} PRIVATE "SHELL:-Xclang -analyzer-opt-analyze-headers")
  # The checks for a batch are looked up where the batch lies.
  if(EXISTS ${CMAKE_CURRENT_SOURCE_DIR}/.clang-tidy)
    configure_file(.clang-tidy .clang-tidy COPYONLY)
  endif()
endfunction()
