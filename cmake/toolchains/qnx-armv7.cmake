# SPDX-License-Identifier: Apache-2.0
# QNX Neutrino on 32-bit ARM, by the SDK's q++: the unit. No SDK was available: this file has never been
# used with a real one. tests/target_build runs it with a stand-in.
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

# This variant has the GNU C++ library, one of the two that the tests ran with. `q++ -V` lists what an SDK
# has. A variant alone takes the SDK's default compiler; with a version before it, as in
# 4.7.3,gcc_ntoarmv7le_gpp, it takes that one. A build by 7.1, for 64-bit ARM, has gcc/8.3.0 there.
# cmake/Compiler.cmake refuses a compiler that is too old.
set(ORVANE_QNX_VARIANT gcc_ntoarmv7le_gpp CACHE STRING "What q++ gets after -V")
set(CMAKE_TRY_COMPILE_PLATFORM_VARIABLES ORVANE_QNX_VARIANT)

# orvane_find_tool(VARIABLE NAME...): searches only the SDK's own tools, never the host's.
function(orvane_find_tool variable)
  find_program(${variable} NAMES ${ARGN} PATHS ${QNX_HOST}/usr/bin NO_DEFAULT_PATH REQUIRED)
endfunction()

# The variant is part of the command: no CXXFLAGS or CMAKE_CXX_FLAGS can replace it, and CMake asks that
# compiler for its version. The compiler itself finds headers and libraries by QNX_TARGET.
orvane_find_tool(ORVANE_QPP q++)
set(CMAKE_CXX_COMPILER ${ORVANE_QPP} -V${ORVANE_QNX_VARIANT})

# SDKs name a tool after its processor, after its whole target with the system's version, or both.
foreach(tool AR RANLIB STRIP OBJCOPY)
  string(TOLOWER ${tool} name)
  set(names ntoarmv7-${name})
  foreach(version 6.5.0 6.6.0 7.0.0 7.1.0)
    list(APPEND names arm-unknown-nto-qnx${version}eabi-${name})
  endforeach()
  orvane_find_tool(CMAKE_${tool} ${names})
endforeach()

set(CMAKE_FIND_ROOT_PATH ${QNX_TARGET} ${QNX_TARGET}/armle-v7)
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

# orvane-unit and the tests are for a development host.
set(ORVANE_KIT OFF CACHE STRING "")
set(ORVANE_TESTS OFF CACHE STRING "")
