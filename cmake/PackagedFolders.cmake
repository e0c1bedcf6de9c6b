# SPDX-License-Identifier: Apache-2.0
# cpack reads this before it packs: everybody may enter the folders, whatever the packer's mask.
file(CHMOD_RECURSE ${CPACK_TEMPORARY_DIRECTORY} DIRECTORY_PERMISSIONS
  OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)
