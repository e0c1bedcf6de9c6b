# SPDX-License-Identifier: Apache-2.0
# Refuses a compiler that can't build this, or is not the one that was asked for. This can't be in a
# toolchain file: CMake knows its compiler only after project(). QCC is CMake's name for the driver of the
# unit's SDK; the version is that of the GCC behind it.
if(CMAKE_CXX_COMPILER_ID MATCHES "^(GNU|QCC)$" AND CMAKE_CXX_COMPILER_VERSION VERSION_LESS 4.7)
  set(advice "")
  if(CMAKE_CXX_COMPILER_ID STREQUAL QCC)
    set(advice " `q++ -V` lists what the SDK has. To name another one, configure again with cmake "
      "--fresh and, for example, -DORVANE_QNX_VARIANT=4.7.3,gcc_ntoarmv7le_gpp.")
  endif()
  string(STRIP "${CMAKE_CXX_COMPILER} ${CMAKE_CXX_COMPILER_ARG1}" compiler)
  message(FATAL_ERROR
    "orvane needs GCC 4.7 or newer. ${compiler} is GCC ${CMAKE_CXX_COMPILER_VERSION}." ${advice})
endif()

# CMake keeps the command of the first configuration, whatever the toolchain file says later.
string(STRIP "${CMAKE_CXX_COMPILER_ARG1}" argument)
if(DEFINED ORVANE_QNX_VARIANT AND NOT argument STREQUAL "-V${ORVANE_QNX_VARIANT}")
  message(FATAL_ERROR "This folder was configured with ${argument}. For -V${ORVANE_QNX_VARIANT} "
    "configure again, with cmake --fresh.")
endif()
