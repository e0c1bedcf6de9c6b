# SPDX-License-Identifier: Apache-2.0
# What makes a fault of ours harder to exploit and costs no measurable start, as an interface target:
# canaries on the stack, checked library calls where the compiler can't prove a size, no executable
# stack, and tables of the loader that are read-only once the program runs. Not in Debug builds:
# _FORTIFY_SOURCE needs optimisation, and the sanitizers see more.
add_library(orvane_hardening INTERFACE)
if(NOT CMAKE_BUILD_TYPE STREQUAL Debug)
  set(protector -fstack-protector-strong)
  orvane_accepts(ORVANE_ACCEPTS_STACK_PROTECTOR_STRONG ${protector})
  if(NOT ORVANE_ACCEPTS_STACK_PROTECTOR_STRONG)
    set(protector -fstack-protector) # GCC before 4.9: functions with an array of characters only
  endif()
  target_compile_options(orvane_hardening INTERFACE
    ${protector} -U_FORTIFY_SOURCE -D_FORTIFY_SOURCE=2)
  target_link_options(orvane_hardening INTERFACE
    LINKER:-z,relro LINKER:-z,now LINKER:-z,noexecstack)
endif()
