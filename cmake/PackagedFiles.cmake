# SPDX-License-Identifier: Apache-2.0
# cpack reads this before it packs, when all files are in their places and the programs are stripped.

# Everybody may enter the folders, whatever the packer's mask.
file(CHMOD_RECURSE ${CPACK_TEMPORARY_DIRECTORY} DIRECTORY_PERMISSIONS
  OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)

if(CPACK_ORVANE_BILL_OF_MATERIALS)
  execute_process(COMMAND ${CPACK_ORVANE_BILL_OF_MATERIALS} --prefix ${CPACK_PACKAGING_INSTALL_PREFIX}
    ${CPACK_TEMPORARY_DIRECTORY} COMMAND_ERROR_IS_FATAL ANY)
else()
  message(STATUS "no bill of materials: it needs a static build by Ninja with Debian's packages, and python3")
endif()
