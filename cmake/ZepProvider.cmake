# SPDX-License-Identifier: Apache-2.0

# For authors of provider plug-ins: part of the source tree and of the installed kit, where find_package(zepcore) defines it.

# A provider plug-in:
#
#   zep_add_provider(Disks Disks.cpp [SOURCE]... [MOF disks.mof] [LIBS zepcore::reasons ...])
#
# The file is libDisks.nsp.so, the name by which a host finds it. It contains zepcore::memory, finds libzepcore.so in its own
# directory, and exports nothing: it registers its provider while it is loaded. A plug-in that exported its own copy of a function
# could replace that function in another plug-in.
#
# MOF: a text in MOF that becomes a part of the plug-in. The header "DisksMof.h" declares it as kMof; zepcore::mof, which reads it,
# is linked.
function(zep_add_provider name)
  cmake_parse_arguments(PARSE_ARGV 1 ARG "" "MOF" "LIBS")
  set(map ${CMAKE_CURRENT_FUNCTION_LIST_DIR}/ZepProvider.map)
  add_library(${name} MODULE ${ARG_UNPARSED_ARGUMENTS})
  target_link_libraries(${name} PRIVATE zepcore::memory ${ARG_LIBS})
  target_link_options(${name} PRIVATE LINKER:--version-script=${map})
  set_target_properties(${name} PROPERTIES
    PREFIX "lib" OUTPUT_NAME ${name} SUFFIX ".nsp.so" LINK_DEPENDS ${map}
    CXX_VISIBILITY_PRESET hidden VISIBILITY_INLINES_HIDDEN ON BUILD_WITH_INSTALL_RPATH ON INSTALL_RPATH "$ORIGIN")
  if(ARG_MOF)
    zep_embed_mof(${name} ${ARG_MOF})
  endif()
endfunction()

# Makes the header with the text; a change of the file makes it anew.
function(zep_embed_mof name file)
  get_filename_component(file ${file} ABSOLUTE)
  file(READ ${file} text)
  set(folder ${CMAKE_CURRENT_BINARY_DIR}/${name}-mof)
  file(CONFIGURE OUTPUT ${folder}/${name}Mof.h @ONLY CONTENT
    "#pragma once\n\n// The text of @file@.\nconstexpr char kMof[] = R\"zep_mof_text(@text@)zep_mof_text\";\n")
  set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${file})
  target_include_directories(${name} PRIVATE ${folder})
  target_link_libraries(${name} PRIVATE zepcore::mof)
endfunction()
