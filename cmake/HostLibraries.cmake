# SPDX-License-Identifier: Apache-2.0
# What the kit and the tests need besides a compiler. Each library is a Debian package, and is header-only
# or built from its sources, so that it works with every compiler, standard library and processor here.
# Each library is an imported target, and ORVANE_KIT_MISSING lists the packages of those that were not
# found.
set(ORVANE_KIT_MISSING "")

# orvane_find_library(NAME DEBIAN_PACKAGE): finds the library by its package's own files for CMake.
macro(orvane_find_library name package)
  find_package(${name} CONFIG QUIET)
  mark_as_advanced(${name}_DIR)
  if(NOT ${name}_FOUND)
    list(APPEND ORVANE_KIT_MISSING ${package})
  endif()
endmacro()

# orvane_find_header(NAME DEBIAN_PACKAGE HEADER): for a package that has no such files, or none that work
# here. Makes the target orvane::NAME.
macro(orvane_find_header name package header)
  find_path(ORVANE_${name}_DIR ${header} ${ARGN})
  mark_as_advanced(ORVANE_${name}_DIR)
  if(ORVANE_${name}_DIR)
    add_library(orvane::${name} INTERFACE IMPORTED)
    target_include_directories(orvane::${name} INTERFACE ${ORVANE_${name}_DIR})
  else()
    list(APPEND ORVANE_KIT_MISSING ${package})
  endif()
endmacro()

orvane_find_library(CLI11 libcli11-dev)
orvane_find_library(nlohmann_json nlohmann-json3-dev)
orvane_find_header(dtl libdtl-dev dtl/dtl.hpp)
# The package's target is a shared library for one processor and one standard library.
orvane_find_header(tomlplusplus libtomlplusplus-dev toml++/toml.h)
# The package's target, also for one processor, names a folder that Debian does not have.
orvane_find_header(utf8cpp libutfcpp-dev utf8.h PATH_SUFFIXES utf8cpp)

# These are sources; no package file describes them.
find_path(ORVANE_GOOGLETEST_DIR googletest/src/gtest-all.cc PATHS /usr/src/googletest NO_CMAKE_FIND_ROOT_PATH)
mark_as_advanced(ORVANE_GOOGLETEST_DIR)
set(ORVANE_TESTS_MISSING ${ORVANE_KIT_MISSING})
if(NOT ORVANE_KIT)
  list(APPEND ORVANE_TESTS_MISSING "the kit, which is off")
endif()
if(NOT ORVANE_GOOGLETEST_DIR)
  list(APPEND ORVANE_TESTS_MISSING googletest)
endif()

# Sets NAME_BUILT from the option NAME (ON, OFF, AUTO) and the list of what is missing for it.
function(orvane_decide name missing)
  string(REPLACE ";" ", " missing_text "${missing}")
  if(${name} STREQUAL AUTO AND missing)
    message(STATUS "${name}: left out, missing: ${missing_text}")
    set(built OFF)
  elseif(${name} AND missing)
    message(FATAL_ERROR "${name} is ON, missing: ${missing_text}")
  elseif(${name} STREQUAL AUTO OR ${name})
    set(built ON)
  else()
    set(built OFF)
  endif()
  set(${name}_BUILT ${built} PARENT_SCOPE)
endfunction()
