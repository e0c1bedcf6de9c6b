# SPDX-License-Identifier: Apache-2.0
# What the kit and the tests need besides a compiler. All of it is a Debian package and header-only
# or built from its sources, so that it serves every compiler, standard library and processor here.
find_path(ORVANE_CLI11_DIR CLI/CLI.hpp)
find_path(ORVANE_TOMLPP_DIR toml++/toml.h)
find_path(ORVANE_JSON_DIR nlohmann/json.hpp)
find_path(ORVANE_DTL_DIR dtl/dtl.hpp)
find_path(ORVANE_UTFCPP_DIR utf8.h PATH_SUFFIXES utf8cpp)
find_path(ORVANE_GOOGLETEST_DIR googletest/src/gtest-all.cc PATHS /usr/src/googletest NO_CMAKE_FIND_ROOT_PATH)
mark_as_advanced(ORVANE_CLI11_DIR ORVANE_TOMLPP_DIR ORVANE_JSON_DIR ORVANE_DTL_DIR ORVANE_UTFCPP_DIR
  ORVANE_GOOGLETEST_DIR)

set(ORVANE_KIT_MISSING "")
foreach(library CLI11:libcli11-dev TOMLPP:libtomlplusplus-dev JSON:nlohmann-json3-dev DTL:libdtl-dev
    UTFCPP:libutfcpp-dev)
  string(REPLACE ":" ";" library ${library})
  list(GET library 0 name)
  list(GET library 1 package)
  if(NOT ORVANE_${name}_DIR)
    list(APPEND ORVANE_KIT_MISSING ${package})
  endif()
endforeach()

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
