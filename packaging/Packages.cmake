# SPDX-License-Identifier: Apache-2.0

# The Debian packages. Each has a changelog and its licence; lintian reports nothing about them (tests/packaging).

set(ZEP_PACKAGE_CONTACT "the zepcore developers <maintainers@localhost>" CACHE STRING "The maintainer that the packages name")

set(CPACK_GENERATOR DEB)
set(CPACK_DEB_COMPONENT_INSTALL ON)
# A build for packages has the types of the library for abidiff and debuggers, without the directory of the build; the preset
# package-debug has those of everything. They go to packages of their own, NAME-dbgsym.
set(CPACK_DEBIAN_DEBUGINFO_PACKAGE ${ZEP_PACKAGED})
if(ZEP_PACKAGED)
  foreach(target core cim_value cim_model loaders os os_shared ipmi proxy proxy_shared smbios usblan ipmi_client packing zep_packing)
    # The second map is for ccache, which makes paths relative to the build directory where it has a base directory.
    target_compile_options(${target} PRIVATE -g -ffile-prefix-map=${PROJECT_SOURCE_DIR}=. -ffile-prefix-map=../..=.)
  endforeach()
else()
  set(CPACK_STRIP_FILES ON)
endif()
set(CPACK_PACKAGE_CONTACT ${ZEP_PACKAGE_CONTACT})
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${ZEP_LIB_DIR})
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
set(CPACK_COMPONENTS_ALL)

# The same sources make the same packages: no file is newer than the changelog.
set(CPACK_PRE_BUILD_SCRIPTS ${CMAKE_CURRENT_SOURCE_DIR}/SetTimes.cmake)

find_program(ZEP_GZIP gzip REQUIRED)
configure_file(changelog.in ${CMAKE_CURRENT_BINARY_DIR}/changelog @ONLY)
execute_process(COMMAND ${ZEP_GZIP} -9 -n -c ${CMAKE_CURRENT_BINARY_DIR}/changelog
  OUTPUT_FILE ${CMAKE_CURRENT_BINARY_DIR}/changelog.gz COMMAND_ERROR_IS_FATAL ANY)

# A package with the files of one component of the installation:
#
#   zep_package(COMPONENT NAME SYNOPSIS TEXT SECTION COPYRIGHT [DEPENDS package,...] [RECOMMENDS ...] [SUGGESTS ...] [PROVIDES ...]
#     [CONFLICTS ...])
#
# A line of TEXT has at most 79 characters.
macro(zep_package component name synopsis text section copyright)
  cmake_parse_arguments(ARG "" "DEPENDS;RECOMMENDS;SUGGESTS;PROVIDES;CONFLICTS" "" ${ARGN})
  string(TOUPPER ${component} upper)
  list(APPEND CPACK_COMPONENTS_ALL ${component})
  set(CPACK_DEBIAN_${upper}_PACKAGE_NAME ${name})
  set(CPACK_DEBIAN_${upper}_PACKAGE_SECTION ${section})
  set(CPACK_COMPONENT_${upper}_DESCRIPTION "${synopsis}\n${text}")
  foreach(relation DEPENDS RECOMMENDS SUGGESTS PROVIDES CONFLICTS)
    set(CPACK_DEBIAN_${upper}_PACKAGE_${relation} ${ARG_${relation}})
  endforeach()
  install(FILES ${CMAKE_CURRENT_BINARY_DIR}/changelog.gz DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/${name} COMPONENT ${component})
  install(FILES ${copyright} DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/${name} RENAME copyright COMPONENT ${component})
endmacro()

set(same_version "(= ${PROJECT_VERSION})")
set(library libzepcore${PROJECT_VERSION_MAJOR})
set(core "${library} ${same_version}")

zep_package(library ${library} "core library of a server diagnostic data collector"
"Identity, hardware and health of a server as CIM objects, which provider
plug-ins collect. This package has the library, which plug-ins and front ends
link, and its library for SMBIOS tables."
  libs copyright RECOMMENDS libcurl4  # loaded at run time, for transfers only
  PROVIDES libzepcore-abi CONFLICTS libzepcore-abi)  # one SONAME at a time: their plug-ins are in one directory

# A provider: zep_provider_package(NAME TITLE WHAT [SUGGESTS ...] [RECOMMENDS ...])
macro(zep_provider_package name title what)
  zep_package(provider_${name} zep-provider-${name} "${title} for the collector zep"
"A provider plug-in of zepcore, which front ends such as zep load:
${what}"
    admin copyright DEPENDS ${core} ${ARGN})
endmacro()
zep_provider_package(host "identity and components of the host" "machine, firmware, boards, processors, memory and operating system.")
zep_provider_package(storage "drives and file systems" "drives, partitions, RAID arrays, volumes and file systems, with their health."
  SUGGESTS smartmontools)  # smartctl reads the health
zep_provider_package(network "network ports and addresses" "ports, interfaces, addresses, routes and resolvers.")
zep_provider_package(devices "PCI and USB devices" "PCI and USB devices, with their drivers and links." RECOMMENDS pci.ids)
zep_provider_package(sensors "sensors and logged errors" "temperatures, fans, voltages, power, and errors that the kernel counts.")

zep_package(ipmi libzepcore-ipmi "management controllers for zepcore, with libfreeipmi"
"The IPMI client library of zepcore, and its provider of management
controllers: sensors, event log, FRU data, accounts and LAN addresses."
  libs copyright-ipmi DEPENDS ${core})
zep_package(zep zep "server diagnostic data collector: reports on this machine"
"The reference front end of zepcore: reports the identity, the hardware and
the problems of this machine, queries management controllers, sends reports,
and makes and checks plug-ins."
  admin copyright DEPENDS "${core}, zep-provider-host ${same_version}"
  RECOMMENDS "zep-provider-storage, zep-provider-network, zep-provider-devices, zep-provider-sensors" SUGGESTS libzepcore-ipmi)
# zep writes new plug-ins, checks them and loads them.
zep_package(development libzepcore-dev "kit for plug-ins and front ends of zepcore"
"Headers, static libraries, files for CMake and pkg-config, and the reduced CIM
schema of the DMTF, if it was built with it."
  libdevel copyright-dev DEPENDS "${core}, zep ${same_version}, libboost-dev, libboost-thread-dev"
  RECOMMENDS "cmake, g++, make, pkg-config" SUGGESTS libzepcore-doc)

install(DIRECTORY ${PROJECT_SOURCE_DIR}/docs/ DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/libzepcore-doc/docs COMPONENT documentation
  FILES_MATCHING PATTERN "*.md" PATTERN "schema" EXCLUDE)
install(FILES ${PROJECT_SOURCE_DIR}/README.md ${PROJECT_SOURCE_DIR}/CHANGELOG.md ${PROJECT_SOURCE_DIR}/CONTRIBUTING.md DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/libzepcore-doc COMPONENT documentation)
install(DIRECTORY ${PROJECT_SOURCE_DIR}/examples DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/libzepcore-doc COMPONENT documentation)
set(CPACK_DEBIAN_DOCUMENTATION_PACKAGE_ARCHITECTURE all)
zep_package(documentation libzepcore-doc "documents and examples of zepcore"
"Tour, architecture, formats and guides for authors of plug-ins and front ends,
and the sources of their examples."
  doc copyright)
include(CPack)
