# SPDX-License-Identifier: Apache-2.0
# cpack reads this for each kind of package: the differences between the two.
if(CPACK_GENERATOR STREQUAL TGZ)
  set(components programs field)
  set(CPACK_PACKAGING_INSTALL_PREFIX /)
  set(CPACK_INCLUDE_TOPLEVEL_DIRECTORY OFF)
elseif(CPACK_GENERATOR STREQUAL DEB)
  set(components programs host)
  set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
endif()
# All into one folder, so that PackagedFiles.cmake can add a file.
set(CPACK_INSTALL_CMAKE_PROJECTS "")
foreach(component IN LISTS components)
  list(APPEND CPACK_INSTALL_CMAKE_PROJECTS ${CPACK_ORVANE_BUILD} orvane ${component} /)
endforeach()
