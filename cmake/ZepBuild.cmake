# SPDX-License-Identifier: Apache-2.0

# Settings for everything that is compiled here (warnings, sanitizers, output directories), and the functions that define
# rooms, platform libraries, plug-ins and tests.

find_package(Boost 1.74 REQUIRED COMPONENTS thread)
find_package(Threads REQUIRED)

if(NOT CMAKE_BUILD_TYPE)
  set(CMAKE_BUILD_TYPE Release CACHE STRING "" FORCE)
endif()
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)

find_program(ZEP_CCACHE ccache)
if(ZEP_CCACHE)
  # Precompiled headers are cached, too. They are identified by their contents, not by their times.
  set(CMAKE_CXX_COMPILER_LAUNCHER ${CMAKE_COMMAND} -E env CCACHE_SLOPPINESS=pch_defines,time_macros ${ZEP_CCACHE})
  if(CMAKE_CXX_COMPILER_ID STREQUAL Clang)
    add_compile_options("SHELL:-Xclang -fno-pch-timestamp")
  else()
    add_compile_options(-fpch-preprocess)
  endif()
endif()

# The build tree resembles the installed one: libraries loaded at run time share a directory; test plug-ins are elsewhere.
set(ZEP_LIB_DIR ${PROJECT_BINARY_DIR}/lib)
set(ZEP_BIN_DIR ${PROJECT_BINARY_DIR}/bin)
set(ZEP_TEST_DIR ${PROJECT_BINARY_DIR}/tests)

add_library(zep_options INTERFACE)
target_compile_features(zep_options INTERFACE cxx_std_17)
target_compile_definitions(zep_options INTERFACE BOOST_ENABLE_ASSERT_HANDLER)
target_compile_options(zep_options INTERFACE -Wall -Wextra -Wpedantic -Wshadow -Wnon-virtual-dtor -Werror)
target_link_libraries(zep_options INTERFACE Boost::headers)
if(ZEP_SANITIZE)
  target_compile_options(zep_options INTERFACE -fsanitize=${ZEP_SANITIZE} -fno-omit-frame-pointer -fno-sanitize-recover=all)
  target_link_options(zep_options INTERFACE -fsanitize=${ZEP_SANITIZE})
  add_link_options(-fsanitize=${ZEP_SANITIZE})
  if(ZEP_SANITIZE STREQUAL "thread")
    target_compile_definitions(zep_options INTERFACE ZEP_THREAD_SANITIZER)
  endif()
endif()

# Hardening. The sanitizers bring checks of their own, and replace the functions that _FORTIFY_SOURCE checks.
if(NOT ZEP_SANITIZE)
  include(CheckPIESupported)
  check_pie_supported(LANGUAGES CXX)
  target_compile_options(zep_options INTERFACE -fstack-protector-strong -fstack-clash-protection -fcf-protection=full
                                               $<$<NOT:$<CONFIG:Debug>>:-U_FORTIFY_SOURCE -D_FORTIFY_SOURCE=2>)
  add_link_options(LINKER:-z,relro LINKER:-z,now)
endif()

if(ZEP_BUILD_FUZZ)
  # Lets the fuzzer see which branches of the library an input takes, not only those of the target itself.
  target_compile_options(zep_options INTERFACE -fsanitize=fuzzer-no-link)
endif()

# A room of libzepcore.so. It can include the public headers and, as "room/Header.h", the private ones; tests/house checks
# which rooms' headers it includes.
function(zep_room name)
  add_library(${name} OBJECT ${ARGN})
  target_link_libraries(${name} PRIVATE zep_options)
  target_compile_options(${name} PRIVATE -fno-semantic-interposition)  # exported functions may be inlined within the library
  target_include_directories(${name} PRIVATE ${PROJECT_SOURCE_DIR}/include ${PROJECT_SOURCE_DIR})
endfunction()

# With ZEP_UNITY, compiles the sources of a folder of the target together, which generates the code of templates once for all of
# them; with the sanitizers, this code takes most of the time. Local names of a folder's sources must therefore differ. The named
# sources of the target are compiled alone.
function(zep_compile_folders_together target)
  if(NOT ZEP_UNITY)
    return()
  endif()
  get_target_property(sources ${target} SOURCES)
  list(REMOVE_ITEM sources ${ARGN})
  foreach(source IN LISTS sources)
    get_filename_component(folder ${source} DIRECTORY)
    set_source_files_properties(${source} PROPERTIES UNITY_GROUP "folder_${folder}")
  endforeach()
  set_target_properties(${target} PROPERTIES UNITY_BUILD ON UNITY_BUILD_MODE GROUP)
endfunction()

# A library that is loaded at run time. It is placed beside libzepcore.so under exactly the given file name. MAP: a version
# script that lists the exported symbols, for a library that exports only some of those that its sources mark. A provider plug-in
# exports nothing, and becomes one of the targets in the global property ZEP_PROVIDER_PLUGINS.
function(zep_loaded_library name file)
  cmake_parse_arguments(ARG "" "MAP" "" ${ARGN})
  add_library(${name} MODULE ${ARG_UNPARSED_ARGUMENTS})
  target_link_libraries(${name} PRIVATE zep_options)
  set_target_properties(${name} PROPERTIES PREFIX "" OUTPUT_NAME ${file} SUFFIX ""
    LIBRARY_OUTPUT_DIRECTORY ${ZEP_LIB_DIR} BUILD_RPATH "$ORIGIN" INSTALL_RPATH "$ORIGIN" BUILD_WITH_INSTALL_RPATH ON)
  if(file MATCHES "\\.nsp\\.so$")
    set_property(GLOBAL APPEND PROPERTY ZEP_PROVIDER_PLUGINS ${name})
    set(ARG_MAP ${PROJECT_SOURCE_DIR}/cmake/ZepProvider.map)
  endif()
  if(ARG_MAP)
    get_filename_component(map ${ARG_MAP} ABSOLUTE)
    target_link_options(${name} PRIVATE LINKER:--version-script=${map})
    set_target_properties(${name} PROPERTIES LINK_DEPENDS ${map})
  endif()
endfunction()

# A GoogleTest program; ctest runs each of its tests separately. LIBS are linked in addition to the library. Tests with the
# same LOCK never run at the same time. DOCUMENTS: the tests keep documents of zep, which documents.schema validates after them.
function(zep_test name)
  cmake_parse_arguments(ARG "DOCUMENTS" "TIMEOUT;LOCK" "SOURCES;LIBS;LABELS;ENVIRONMENT" ${ARGN})
  if(NOT ARG_TIMEOUT)
    set(ARG_TIMEOUT 60)
  endif()
  if(ZEP_SANITIZE MATCHES thread)  # makes some tests ten times slower
    math(EXPR ARG_TIMEOUT "10 * ${ARG_TIMEOUT}")
  elseif(ZEP_SANITIZE)
    math(EXPR ARG_TIMEOUT "4 * ${ARG_TIMEOUT}")
  endif()
  add_executable(${name} ${ARG_SOURCES})
  target_link_libraries(${name} PRIVATE test_support ${ARG_LIBS} GTest::gtest_main)
  target_precompile_headers(${name} REUSE_FROM test_support)
  set_target_properties(${name} PROPERTIES RUNTIME_OUTPUT_DIRECTORY ${ZEP_TEST_DIR})
  set(properties TIMEOUT ${ARG_TIMEOUT})
  if(ARG_LABELS)
    list(APPEND properties LABELS "${ARG_LABELS}")
  endif()
  if(ARG_ENVIRONMENT)
    list(APPEND properties ENVIRONMENT "${ARG_ENVIRONMENT}")
  endif()
  if(ARG_DOCUMENTS)
    list(APPEND properties FIXTURES_REQUIRED documents)
  endif()
  if(ARG_LOCK)
    list(APPEND properties RESOURCE_LOCK "${ARG_LOCK}")
  endif()
  if(ZEP_SANITIZE)  # once in some thousand tests the search for leaks itself crashes, after the test has passed
    list(APPEND properties SKIP_REGULAR_EXPRESSION ".  SKIPPED .|PASSED  . 1 test.*Tracer caught signal")
  endif()
  gtest_discover_tests(${name} TEST_PREFIX "${name}." DISCOVERY_MODE PRE_TEST DISCOVERY_TIMEOUT 60 PROPERTIES ${properties})
endfunction()
