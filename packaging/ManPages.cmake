# SPDX-License-Identifier: Apache-2.0

# The manual pages of zep and of each of its commands, made from their help texts, so that both say the same. A sanitized build is
# not installed, and has none.

if(ZEP_SANITIZE)
  return()
endif()
set(pages ${CMAKE_CURRENT_BINARY_DIR}/man)
add_custom_command(OUTPUT ${pages}/zep.1.gz
  COMMAND ${CMAKE_CURRENT_SOURCE_DIR}/man-pages.sh $<TARGET_FILE:zep> ${PROJECT_VERSION} ${pages}
  DEPENDS zep ${CMAKE_CURRENT_SOURCE_DIR}/man-pages.sh VERBATIM COMMENT "Making the manual pages")
add_custom_target(man_pages ALL DEPENDS ${pages}/zep.1.gz)
install(DIRECTORY ${pages}/ DESTINATION ${CMAKE_INSTALL_MANDIR}/man1 COMPONENT zep)
