# SPDX-License-Identifier: Apache-2.0

# The manual pages of zep and of each of its commands, made from their help texts, and zep.cfg(5) and libzepcore(7), made from
# sections of the documents, so that both say the same. A sanitized build is not installed, and has none.

if(ZEP_SANITIZE)
  return()
endif()
find_program(ZEP_GZIP gzip REQUIRED)
set(pages ${CMAKE_CURRENT_BINARY_DIR}/man)
add_custom_command(OUTPUT ${pages}/zep.1.gz
  COMMAND ${CMAKE_CURRENT_SOURCE_DIR}/man-pages.sh $<TARGET_FILE:zep> ${PROJECT_VERSION} ${pages}
  DEPENDS zep ${CMAKE_CURRENT_SOURCE_DIR}/man-pages.sh VERBATIM COMMENT "Making the manual pages")
add_custom_target(man_pages ALL DEPENDS ${pages}/zep.1.gz)
install(DIRECTORY ${pages}/ DESTINATION ${CMAKE_INSTALL_MANDIR}/man1 COMPONENT zep)

# zep_document_page(NAME SECTION COMPONENT SUMMARY SEE_ALSO [PAGE HEADING]...): the sections HEADING of the pages docs/PAGE.
find_program(ZEP_LOWDOWN lowdown)
if(NOT ZEP_LOWDOWN)
  message(STATUS "lowdown: none, so the manual pages zep.cfg(5) and libzepcore(7) are not made")
endif()
function(zep_document_page name section component summary see_also)
  if(NOT ZEP_LOWDOWN)
    return()
  endif()
  set(file ${CMAKE_CURRENT_BINARY_DIR}/${name}.${section}.gz)
  set(script ${CMAKE_CURRENT_SOURCE_DIR}/document-page.sh)
  file(GLOB documents CONFIGURE_DEPENDS ${PROJECT_SOURCE_DIR}/docs/*.md)
  add_custom_command(OUTPUT ${file}
    COMMAND ${script} ${name} ${section} ${PROJECT_VERSION} ${summary} ${see_also} ${ARGN} | ${ZEP_GZIP} -9 -n > ${file}
    DEPENDS ${script} ${documents} WORKING_DIRECTORY ${PROJECT_SOURCE_DIR}/docs VERBATIM COMMENT "Making ${name}(${section})")
  add_custom_target(man_${name} ALL DEPENDS ${file})
  install(FILES ${file} DESTINATION ${CMAKE_INSTALL_MANDIR}/man${section} COMPONENT ${component})
endfunction()
zep_document_page(zep.cfg 5 zep "settings of zep and of the library" "zep(1), zep-config(1), libzepcore(7)"
  formats.md Settings findings.md Thresholds)
zep_document_page(libzepcore 7 development "core library of a server diagnostic data collector" "zep(1), zep.cfg(5)"
  tour.md "Handle an error" architecture.md Threads architecture.md Errors tour.md "Which header to open")
