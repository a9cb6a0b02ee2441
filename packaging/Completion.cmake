# SPDX-License-Identifier: Apache-2.0

# The files with which bash, fish and zsh complete the command line of zep, made by zep itself. A sanitized build is not installed,
# and has none.

if(ZEP_SANITIZE)
  return()
endif()

# zep_completion(SHELL DIRECTORY NAME)
function(zep_completion shell directory name)
  set(file ${CMAKE_CURRENT_BINARY_DIR}/completion/${shell}/${name})
  file(MAKE_DIRECTORY ${CMAKE_CURRENT_BINARY_DIR}/completion/${shell})
  add_custom_command(OUTPUT ${file} COMMAND zep help --completion ${shell} > ${file} VERBATIM
    COMMENT "Making the completion for ${shell}")
  add_custom_target(completion_${shell} ALL DEPENDS ${file})
  install(FILES ${file} DESTINATION ${CMAKE_INSTALL_DATADIR}/${directory} COMPONENT zep)
endfunction()
zep_completion(bash bash-completion/completions zep)
zep_completion(fish fish/vendor_completions.d zep.fish)
zep_completion(zsh zsh/vendor-completions _zep)
