# SPDX-License-Identifier: Apache-2.0
# Compilers, and clang-tidy even more, spend most of their time on system and library headers, again for
# each source. A batch compiles the sources of a folder as one, so reads each header once. It is for builds from
# nothing: a change of one source compiles its whole folder.
set(ORVANE_BATCHES "" CACHE STRING "Targets whose sources are compiled a folder at a time")

# orvane_batch_by_folder(TARGET [ALONE SOURCE...]): batches the sources of TARGET by folder, except each
# SOURCE that defines a name which another source of its folder also defines.
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
  # GCC takes an included source for a header, in which a class of an unnamed namespace would differ for
  # each source. clang-tidy finds those in real headers.
  target_compile_options(${target} PRIVATE $<$<CXX_COMPILER_ID:GNU>:-Wno-subobject-linkage>)
  # clang-tidy looks for its configuration next to the batch.
  if(EXISTS ${CMAKE_CURRENT_SOURCE_DIR}/.clang-tidy)
    configure_file(.clang-tidy .clang-tidy COPYONLY)
  endif()
endfunction()
