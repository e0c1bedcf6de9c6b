# SPDX-License-Identifier: Apache-2.0
# Which libraries a program brings along, as an interface target.
option(ORVANE_STATIC "Link the programs statically, so that they start inside a unit as they are" OFF)

# What links the C++ library statically and the C library dynamically, in the order of trying. Nothing
# says whether the SDK's driver hands on GCC's options; its documentation has the position between
# -Bstatic and -Bdynamic (6.6, 7.0). A driver names the shared libraries behind it again, which then
# nothing needs. Before 7.1 libgcc is static alone, and there may be no libgcc_eh.
set(ORVANE_WAYS_TO_A_STATIC_CXX_LIBRARY
  "-static-libstdc++ -static-libgcc"
  "-Wl,--as-needed -Bstatic -lstdc++ -lgcc_eh -lgcc -Bdynamic"
  "-Wl,--as-needed -Bstatic -lstdc++ -Bdynamic")

# Sets RESULT to the shared libraries, but for the C library, that a program linked with these words
# needs, or to NOTFOUND where none is linked. The program itself is asked: a driver may accept an option
# and link as ever. Whatever is not of the C library counts: its SDK may have any C++ library.
function(orvane_needed_libraries result)
  set(program ${CMAKE_CURRENT_BINARY_DIR}/CMakeFiles/static_cxx_library)
  try_compile(linked
    SOURCE_FROM_CONTENT static_cxx_library.cpp "#include <iostream>\nint main() { std::cout << 1; }\n"
    LINK_LIBRARIES ${ARGN} CXX_STANDARD 11 COPY_FILE ${program} COPY_FILE_ERROR ignored NO_CACHE)
  set(needed NOTFOUND)
  if(linked)
    file(STRINGS ${program} needed REGEX "^lib.*[.]so[.0-9]*$")
    list(FILTER needed EXCLUDE REGEX "^lib[cm][.]so[.0-9]*$")
  endif()
  set(${result} "${needed}" PARENT_SCOPE)
endfunction()

add_library(orvane_program INTERFACE)
if(ORVANE_STATIC)
  target_link_options(orvane_program INTERFACE -static)
elseif(CMAKE_SYSTEM_NAME STREQUAL QNX)
  # A unit may lack the compiler's own libraries, or have those of another compiler. Its C library is
  # the one that belongs to it.
  if(NOT DEFINED ORVANE_STATIC_CXX_LIBRARY)
    set(found "")
    foreach(way IN LISTS ORVANE_WAYS_TO_A_STATIC_CXX_LIBRARY)
      separate_arguments(words UNIX_COMMAND "${way}")
      orvane_needed_libraries(needed ${words})
      if("${needed}" STREQUAL "")
        set(found ${words})
        break()
      endif()
    endforeach()
    if(NOT found)
      message(STATUS "the unit needs the C++ library of this compiler: it cannot be linked statically")
    endif()
    set(ORVANE_STATIC_CXX_LIBRARY "${found}" CACHE INTERNAL "What links the C++ library statically")
  endif()
  target_link_libraries(orvane_program INTERFACE ${ORVANE_STATIC_CXX_LIBRARY})
endif()
