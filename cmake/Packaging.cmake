# SPDX-License-Identifier: Apache-2.0
# What `cmake --install` installs and `cpack` packs. There are three components: `programs` runs on a unit
# or a host, `host` adds what people at a host need, `field` adds what a unit needs. The Debian package
# holds programs and host, the tarball for a target holds programs and field.
include(GNUInstallDirs)

install(TARGETS orvane RUNTIME COMPONENT programs)
install(PROGRAMS field/orvane-field TYPE BIN COMPONENT field EXCLUDE_FROM_ALL)
# Debian has the text of the licence, and only refers to it.
install(FILES packaging/copyright DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT host)
install(FILES LICENSE DESTINATION ${CMAKE_INSTALL_DOCDIR} RENAME copyright COMPONENT field EXCLUDE_FROM_ALL)
install(FILES packaging/lintian-overrides DESTINATION ${CMAKE_INSTALL_DATADIR}/lintian/overrides RENAME orvane
  COMPONENT host)
if(ORVANE_KIT_BUILT)
  install(TARGETS orvane-unit RUNTIME COMPONENT programs)
  install(FILES completion/orvane-unit.bash COMPONENT host
    DESTINATION ${CMAKE_INSTALL_DATADIR}/bash-completion/completions RENAME orvane-unit)
  install(FILES completion/orvane-unit.fish COMPONENT host
    DESTINATION ${CMAKE_INSTALL_DATADIR}/fish/vendor_completions.d)
  # Debian's zsh looks for packages' completions in a folder of its own.
  foreach(folder site-functions vendor-completions)
    install(FILES completion/_orvane-unit COMPONENT host
      DESTINATION ${CMAKE_INSTALL_DATADIR}/zsh/${folder})
  endforeach()
endif()

find_program(ORVANE_GZIP gzip)
mark_as_advanced(ORVANE_GZIP)
# install_compressed FILE FOLDER NAME: Debian wants pages compressed; -n omits the date.
function(install_compressed file folder name)
  if(NOT ORVANE_GZIP)
    message(STATUS "no gzip: ${file} will not be installed")
    return()
  endif()
  set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${file})
  set(compressed ${CMAKE_CURRENT_BINARY_DIR}/compressed/${name}.gz)
  file(MAKE_DIRECTORY ${CMAKE_CURRENT_BINARY_DIR}/compressed)
  execute_process(COMMAND ${ORVANE_GZIP} -9n COMMAND_ERROR_IS_FATAL ANY
    INPUT_FILE ${CMAKE_CURRENT_SOURCE_DIR}/${file} OUTPUT_FILE ${compressed})
  install(FILES ${compressed} DESTINATION ${folder} COMPONENT host)
endfunction()
install_compressed(man/orvane.1 ${CMAKE_INSTALL_MANDIR}/man1 orvane.1)
if(ORVANE_KIT_BUILT)
  install_compressed(man/orvane-unit.1 ${CMAKE_INSTALL_MANDIR}/man1 orvane-unit.1)
endif()

# What the scripts in packaging need.
find_package(Python3 3.9 QUIET COMPONENTS Interpreter)
if(Python3_FOUND)
  set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS CHANGELOG.md packaging/debian_changelog.py)
  set(changelog ${CMAKE_CURRENT_BINARY_DIR}/compressed/changelog.gz)
  file(MAKE_DIRECTORY ${CMAKE_CURRENT_BINARY_DIR}/compressed)
  execute_process(COMMAND_ERROR_IS_FATAL ANY
    COMMAND ${Python3_EXECUTABLE} ${CMAKE_CURRENT_SOURCE_DIR}/packaging/debian_changelog.py
      ${CMAKE_CURRENT_SOURCE_DIR}/CHANGELOG.md ${changelog})
  install(FILES ${changelog} DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT host)
else()
  message(STATUS "no python3 of 3.9 or newer: CHANGELOG.md will not be installed")
endif()
install(FILES README.md SECURITY.md DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT host)
install(DIRECTORY docs DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT host)

set(CPACK_PACKAGE_NAME orvane)
set(CPACK_PACKAGE_VENDOR "the orvane developers")
set(CPACK_PACKAGE_CONTACT "orvane developers <orvane@example.org>")
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "accessory configuration files for a vehicle head unit")
set(CPACK_PACKAGE_DESCRIPTION
  "orvane runs once at the boot of a head unit and writes the configuration
files of its phone projection stacks. orvane-unit makes simulated units, and
says on a desk exactly what orvane will write on a unit and why.")
set(CPACK_STRIP_FILES ON)
set(CPACK_PRE_BUILD_SCRIPTS ${CMAKE_CURRENT_LIST_DIR}/PackagedFiles.cmake)
set(CPACK_POST_BUILD_SCRIPTS ${CMAKE_CURRENT_LIST_DIR}/PackedAgain.cmake)
if(Python3_FOUND)
  set(CPACK_ORVANE_REPEATABLE ${Python3_EXECUTABLE} ${CMAKE_CURRENT_SOURCE_DIR}/packaging/repeatable.py)
endif()
set(CPACK_PACKAGE_DIRECTORY ${PROJECT_BINARY_DIR}/packages)
set(CPACK_GENERATOR DEB TGZ)
set(CPACK_ORVANE_BUILD ${PROJECT_BINARY_DIR})
set(CPACK_PROJECT_CONFIG_FILE ${CMAKE_CURRENT_LIST_DIR}/PackagingByGenerator.cmake)

set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SECTION devel)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
if(NOT ORVANE_STATIC)
  set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON) # static programs depend on nothing
endif()

string(TOLOWER "${CMAKE_SYSTEM_NAME}-${CMAKE_SYSTEM_PROCESSOR}" ORVANE_TARGET)
set(CPACK_PACKAGE_FILE_NAME orvane-${PROJECT_VERSION}-${ORVANE_TARGET})

# The bill of materials says what the programs contain of which Debian package.
find_program(ORVANE_DPKG_QUERY dpkg-query)
mark_as_advanced(ORVANE_DPKG_QUERY)
if(ORVANE_STATIC AND CMAKE_GENERATOR STREQUAL Ninja AND ORVANE_DPKG_QUERY AND Python3_FOUND)
  set(CPACK_ORVANE_BILL_OF_MATERIALS ${Python3_EXECUTABLE}
    ${CMAKE_CURRENT_SOURCE_DIR}/packaging/bill_of_materials.py --ninja ${CMAKE_MAKE_PROGRAM}
    --build ${PROJECT_BINARY_DIR} --sources ${PROJECT_SOURCE_DIR}
    --name ${CPACK_PACKAGE_FILE_NAME} --version ${PROJECT_VERSION})
endif()
include(CPack)
