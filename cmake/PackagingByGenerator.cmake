# SPDX-License-Identifier: Apache-2.0
# cpack reads this for each kind of package: the differences between the two.
if(CPACK_GENERATOR STREQUAL TGZ)
  set(CPACK_COMPONENTS_ALL programs field)
  set(CPACK_ARCHIVE_COMPONENT_INSTALL ON)
  set(CPACK_COMPONENTS_GROUPING ALL_COMPONENTS_IN_ONE)
  set(CPACK_PACKAGING_INSTALL_PREFIX /)
elseif(CPACK_GENERATOR STREQUAL DEB)
  set(CPACK_COMPONENTS_ALL programs host)
  set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
endif()
