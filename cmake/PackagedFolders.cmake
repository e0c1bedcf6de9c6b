# SPDX-License-Identifier: Apache-2.0
# Read by cpack before it packs: folders that everybody may enter, whatever the mask of who packs.
file(CHMOD_RECURSE ${CPACK_TEMPORARY_DIRECTORY} DIRECTORY_PERMISSIONS
  OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)
