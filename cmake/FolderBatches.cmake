# SPDX-License-Identifier: Apache-2.0
# Compilers, and clang-tidy still more, spend most of their time on the headers of the system and of the
# libraries, again for each source. In a batch the sources of a folder are one, with one look at their
# headers. That is for builds from nothing: after a change of one source its whole folder is compiled.
set(ORVANE_BATCHES "" CACHE STRING "Targets whose sources are compiled a folder at a time")

# orvane_batch_by_folder(TARGET [ALONE SOURCE...]): the sources of TARGET, but those that are to stay
# alone, since they have a name of their own that another source of their folder has, too.
function(orvane_batch_by_folder target)
  if(NOT target IN_LIST ORVANE_BATCHES)
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
  # GCC takes what is included for a header, where a class of an unnamed namespace would be another one
  # for each source. clang-tidy sees to those.
  target_compile_options(${target} PRIVATE $<$<CXX_COMPILER_ID:GNU>:-Wno-subobject-linkage>)
  # The checks of clang-tidy for a batch are looked up where the batch lies.
  if(EXISTS ${CMAKE_CURRENT_SOURCE_DIR}/.clang-tidy)
    configure_file(.clang-tidy .clang-tidy COPYONLY)
  endif()
endfunction()
