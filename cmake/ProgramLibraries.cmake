# SPDX-License-Identifier: Apache-2.0
# The libraries that a program contains, as an interface target.
option(ORVANE_STATIC "Link the programs statically, so that they start inside a unit as they are" OFF)

# Ways to link the C++ library statically and the C library dynamically, in the order in which they are
# tried. No page says whether the SDK's driver passes GCC's options on; its documentation has the position
# between -Bstatic and -Bdynamic (6.6, 7.0). A driver names the shared libraries again after it; then
# nothing needs them. Before 7.1 there is only a static libgcc, and there may be no libgcc_eh.
set(ORVANE_WAYS_TO_A_STATIC_CXX_LIBRARY
  "-static-libstdc++ -static-libgcc"
  "-Wl,--as-needed -Bstatic -lstdc++ -lgcc_eh -lgcc -Bdynamic"
  "-Wl,--as-needed -Bstatic -lstdc++ -Bdynamic")

# Sets RESULT to the shared libraries, except the C library, that a program linked with these words needs,
# or to NOTFOUND if no program can be linked. The program itself is read: a driver may accept an option and
# ignore it. Everything outside the C library counts: the SDK may have any C++ library.
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
  # The map says which members of which archives a program contains (packaging/bill_of_materials.py).
  target_link_options(orvane_program INTERFACE -static
    "LINKER:-Map=${PROJECT_BINARY_DIR}/$<TARGET_PROPERTY:NAME>.map")
elseif(CMAKE_SYSTEM_NAME STREQUAL QNX)
  # A unit may lack the compiler's own libraries, or have those of another compiler. Its C library belongs
  # to the unit.
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
