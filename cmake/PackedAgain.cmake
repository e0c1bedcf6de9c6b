# SPDX-License-Identifier: Apache-2.0
# cpack reads this when it has made the packages.
if(CPACK_ORVANE_REPEATABLE)
  execute_process(COMMAND ${CPACK_ORVANE_REPEATABLE} ${CPACK_PACKAGE_FILES} COMMAND_ERROR_IS_FATAL ANY)
endif()
