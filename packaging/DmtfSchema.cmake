# SPDX-License-Identifier: Apache-2.0

# The reduced DMTF CIM schema, which the package of the kit carries with the notice of the DMTF, so that `zep plugin new` knows the
# standard classes. The source tree has no part of the schema. Its archive is in the folder that the environment variable
# ZEP_DMTF_SCHEMA names, or in shared/data/dmtf-schema of a folder above the source tree. Without it, the package has no schema.

function(zep_find_dmtf_archive result)
  set(folders $ENV{ZEP_DMTF_SCHEMA})
  cmake_path(GET PROJECT_SOURCE_DIR PARENT_PATH above)
  while(NOT above STREQUAL folder)
    list(APPEND folders ${above}/shared/data/dmtf-schema)
    set(folder ${above})
    cmake_path(GET folder PARENT_PATH above)
  endwhile()
  foreach(folder IN LISTS folders)
    file(GLOB archives ${folder}/cim_schema_*-MOFs.zip)
    if(archives)
      list(GET archives -1 newest)
      set(${result} ${newest} PARENT_SCOPE)
      return()
    endif()
  endforeach()
endfunction()

if(ZEP_SANITIZE)  # nothing is packaged, and the program below would take long
  return()
endif()
add_executable(ReduceSchema ReduceSchema.cpp)
target_link_libraries(ReduceSchema PRIVATE zep_options mof)

zep_find_dmtf_archive(archive)
if(NOT archive)
  message(STATUS "DMTF CIM schema: none, so libzepcore-dev carries none (ZEP_DMTF_SCHEMA names the folder with its archive)")
  return()
endif()
message(STATUS "DMTF CIM schema: ${archive}")

# "cim_schema_2.49.0" of "cim_schema_2.49.0Final-MOFs.zip".
string(REGEX MATCH "cim_schema_[0-9.]*[0-9]" name ${archive})
set(schema ${CMAKE_CURRENT_BINARY_DIR}/dmtf-schema)
set(reduced ${CMAKE_CURRENT_BINARY_DIR}/${name}-reduced.mof)
file(MAKE_DIRECTORY ${schema})
add_custom_command(OUTPUT ${reduced}
  COMMAND ${CMAKE_COMMAND} -E tar xf ${archive}
  COMMAND ReduceSchema ${name}.mof ${reduced}
  DEPENDS ${archive} ReduceSchema WORKING_DIRECTORY ${schema} COMMENT "Reducing the DMTF CIM schema" VERBATIM)
add_custom_target(reduced_schema ALL DEPENDS ${reduced})
install(FILES ${reduced} DESTINATION ${CMAKE_INSTALL_DATADIR}/zepcore/schema COMPONENT development)
