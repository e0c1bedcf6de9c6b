# SPDX-License-Identifier: Apache-2.0
# Options that make a bug of ours harder to exploit and don't measurably delay the start, as an interface
# target: stack canaries, checked library calls where the compiler can't prove a size, no executable
# stack, and loader tables that are read-only once the program runs. Debug builds don't have them:
# _FORTIFY_SOURCE needs optimisation, and the sanitizers see more.
include(CheckCXXSourceCompiles)

# Sets RESULT to whether a function that OPTION protects can be compiled and linked: a canary also needs
# the C library.
function(orvane_protects result option)
  set(CMAKE_CXX_STANDARD 11)
  set(CMAKE_REQUIRED_FLAGS ${option})
  set(source "int main(int count, char**) {
    char text[64];
    volatile char* end = text + count;
    *end = 1;
    return *end;
  }")
  check_cxx_source_compiles("${source}" ${result} FAIL_REGEX "warning: [^\n]*${option}")
endfunction()

add_library(orvane_hardening INTERFACE)
if(NOT CMAKE_BUILD_TYPE STREQUAL Debug)
  set(protector -fstack-protector-strong)
  orvane_protects(ORVANE_STACK_PROTECTOR_STRONG ${protector})
  if(NOT ORVANE_STACK_PROTECTOR_STRONG)
    set(protector -fstack-protector) # GCC before 4.9: functions with an array of characters only
    orvane_protects(ORVANE_STACK_PROTECTOR ${protector})
    if(NOT ORVANE_STACK_PROTECTOR)
      set(protector "")
      message(STATUS "no stack protector: this compiler and its C library have none")
    endif()
  endif()
  target_compile_options(orvane_hardening INTERFACE
    ${protector} -U_FORTIFY_SOURCE -D_FORTIFY_SOURCE=2)
  orvane_add_linker_options(orvane_hardening -z,relro -z,now -z,noexecstack)
endif()
