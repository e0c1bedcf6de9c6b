# SPDX-License-Identifier: Apache-2.0
# QNX Neutrino on 32-bit ARM, by the SDK's q++: the unit. No SDK was at hand: never run with a real
# one. docs/porting.md says what was tried in its place.
#
#   . <the SDK's environment script>      # sets QNX_HOST and QNX_TARGET
#   cmake -B build -DCMAKE_TOOLCHAIN_FILE=cmake/toolchains/qnx-armv7.cmake
set(CMAKE_SYSTEM_NAME QNX)
set(CMAKE_SYSTEM_PROCESSOR armv7)

foreach(variable QNX_HOST QNX_TARGET)
  if("$ENV{${variable}}" STREQUAL "")
    message(FATAL_ERROR "${variable} is not set: run the QNX SDK's environment script first")
  endif()
  file(TO_CMAKE_PATH "$ENV{${variable}}" ${variable})
endforeach()

# The GNU C++ library, one of the two that the tests ran with. `q++ -V` lists what an SDK has; a
# compiler's version may stand before it, as in 8.3.0,gcc_ntoarmv7le_gpp.
set(ORVANE_QNX_VARIANT gcc_ntoarmv7le_gpp CACHE STRING "What q++ gets after -V")
set(CMAKE_TRY_COMPILE_PLATFORM_VARIABLES ORVANE_QNX_VARIANT)

# It finds headers and libraries by QNX_TARGET itself.
set(CMAKE_CXX_COMPILER ${QNX_HOST}/usr/bin/q++)
set(CMAKE_CXX_FLAGS_INIT -V${ORVANE_QNX_VARIANT})

# By name, or CMake would take the host's.
foreach(tool AR RANLIB STRIP OBJCOPY)
  string(TOLOWER ${tool} name)
  set(CMAKE_${tool} ${QNX_HOST}/usr/bin/ntoarmv7-${name} CACHE FILEPATH "")
endforeach()

set(CMAKE_FIND_ROOT_PATH ${QNX_TARGET} ${QNX_TARGET}/armle-v7)
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

# orvane-unit and the tests are for a development host.
set(ORVANE_KIT OFF CACHE STRING "")
set(ORVANE_TESTS OFF CACHE STRING "")
