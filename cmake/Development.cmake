# SPDX-License-Identifier: Apache-2.0
# What `cmake --install BUILD --component development` installs: the library, its headers and the files
# by which find_package(orvane) finds them. This component is in no package: users of the programs do not
# need it.
include(CMakePackageConfigHelpers)
include(GNUInstallDirs)

set(package_folder ${CMAKE_INSTALL_LIBDIR}/cmake/orvane)
set_target_properties(orvane_core PROPERTIES EXPORT_NAME core)
install(TARGETS orvane_core EXPORT orvane
  ARCHIVE COMPONENT development EXCLUDE_FROM_ALL
  FILE_SET HEADERS DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/orvane COMPONENT development EXCLUDE_FROM_ALL)
install(EXPORT orvane NAMESPACE orvane:: FILE orvaneConfig.cmake DESTINATION ${package_folder}
  COMPONENT development EXCLUDE_FROM_ALL)
write_basic_package_version_file(orvaneConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/orvaneConfigVersion.cmake DESTINATION ${package_folder}
  COMPONENT development EXCLUDE_FROM_ALL)
