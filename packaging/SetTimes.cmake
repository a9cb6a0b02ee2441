# SPDX-License-Identifier: Apache-2.0

# Sets the time of every file to be packaged to SOURCE_DATE_EPOCH, if that is set; CPack runs this before it makes the packages.

if(DEFINED ENV{SOURCE_DATE_EPOCH})
  execute_process(COMMAND find ${CPACK_TEMPORARY_DIRECTORY} -exec touch --no-dereference --date=@$ENV{SOURCE_DATE_EPOCH} {} +
    COMMAND_ERROR_IS_FATAL ANY)
endif()
