# SPDX-License-Identifier: Apache-2.0
# Which libraries a program brings along, as an interface target.
option(ORVANE_STATIC "Link the programs statically, so that they start inside a unit as they are" OFF)

add_library(orvane_program INTERFACE)
if(ORVANE_STATIC)
  target_link_options(orvane_program INTERFACE -static)
elseif(CMAKE_SYSTEM_NAME STREQUAL QNX)
  # A unit may lack the compiler's own libraries, or have those of another compiler. Its C library is
  # the one that belongs to it. The program itself is asked what it needs: a driver may accept the
  # options and link as ever.
  set(options -static-libstdc++ -static-libgcc)
  if(NOT DEFINED ORVANE_STATIC_CXX_LIBRARY)
    set(program ${CMAKE_CURRENT_BINARY_DIR}/CMakeFiles/static_cxx_library)
    try_compile(linked
      SOURCE_FROM_CONTENT static_cxx_library.cpp "#include <iostream>\nint main() { std::cout << 1; }\n"
      LINK_OPTIONS ${options} CXX_STANDARD 11 COPY_FILE ${program} COPY_FILE_ERROR ignored NO_CACHE)
    set(needed "")
    if(linked)
      file(STRINGS ${program} needed REGEX "lib(stdc[+][+]|c[+][+]|gcc_s)[.]so")
    endif()
    if(linked AND NOT needed)
      set(result ON)
    else()
      set(result OFF)
      message(STATUS "the unit needs the C++ library of this compiler: it cannot be linked statically")
    endif()
    set(ORVANE_STATIC_CXX_LIBRARY ${result} CACHE INTERNAL "The C++ library can be linked statically")
  endif()
  if(ORVANE_STATIC_CXX_LIBRARY)
    target_link_options(orvane_program INTERFACE ${options})
  endif()
endif()
