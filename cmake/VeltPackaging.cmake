# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Debian packages with CPack, one per install component (VeltComponents.cmake),
# built by `make package` into build/package/packages/. The dependencies
# between the packages are exact versions; those on the system's libraries
# come from dpkg-shlibdeps.
set(CPACK_PACKAGE_NAME velt-conduit)
set(CPACK_PACKAGE_VENDOR "The Velt Conduit Authors")
set(CPACK_PACKAGE_CONTACT "${VELT_PACKAGE_MAINTAINER}")
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "${PROJECT_DESCRIPTION}")
set(CPACK_RESOURCE_FILE_LICENSE ${PROJECT_SOURCE_DIR}/LICENSE)
set(CPACK_PACKAGE_DIRECTORY ${VELT_PACKAGE_DIR})
set(CPACK_GENERATOR DEB)
set(CPACK_STRIP_FILES ON)

set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_COMPONENTS_ALL ${VELT_COMPONENTS})
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_MAINTAINER "${VELT_PACKAGE_MAINTAINER}")
set(CPACK_DEBIAN_PACKAGE_SECTION net)
set(CPACK_DEBIAN_PACKAGE_PRIORITY optional)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_COMPRESSION_TYPE xz)

function(velt_deb_component component section summary description)
  string(TOUPPER ${component} upper)
  set(CPACK_DEBIAN_${upper}_PACKAGE_NAME ${VELT_PACKAGE_${component}} PARENT_SCOPE)
  set(CPACK_DEBIAN_${upper}_PACKAGE_SECTION ${section} PARENT_SCOPE)
  set(CPACK_COMPONENT_${upper}_DESCRIPTION "${summary}\n${description}" PARENT_SCOPE)
endfunction()

velt_deb_component(plugin net "Velt Conduit token socket driver plug-in"
  "The communication driver VELT for operator-panel runtimes: a plug-in that a
host loads with dlopen and enters through GetInterfaceFactory. Each instance
owns one raw UDP or TCP channel and turns what arrives into tokens framed by
configurable prefixes and suffixes or by a silence gap.")
velt_deb_component(libraries libs "Velt Conduit reference POSIX host library"
  "The services a panel runtime offers the Velt Conduit plug-in (tasks, mutexes,
sockets, a durable file store) and the loader that opens the plug-in.")
velt_deb_component(development libdevel "Velt Conduit host interfaces and host library (development files)"
  "The host interface headers, the reference host library (static and shared),
the CMake package Velt and the pkg-config files velt-hostapi and velt-host.")
velt_deb_component(tools net "Velt Conduit console host and device simulator"
  "velt-host loads the Velt Conduit plug-in into the reference host and drives its
channels from a console; velt-peer simulates a TCP or UDP device.")
velt_deb_component(debug debug "debug symbols for velt-conduit"
  "The debug information of the Velt Conduit plug-in, found by the
plug-in's build identifier.")

# A package that holds a shared library declares it for dpkg-shlibdeps
# (shlibs) and has ldconfig run through a trigger.
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS_POLICY "=")
file(WRITE ${PROJECT_BINARY_DIR}/package-control/triggers "activate-noawait ldconfig\n")
set(CPACK_DEBIAN_LIBRARIES_PACKAGE_CONTROL_EXTRA ${PROJECT_BINARY_DIR}/package-control/triggers)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
# The static host library links zlib; the rest come from the component
# dependencies below.
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS "zlib1g-dev")
set(CPACK_DEBIAN_DEBUG_PACKAGE_PRIORITY optional)

set(CPACK_DEBIAN_ENABLE_COMPONENT_DEPENDS ON)
if(VELT_BUILD_HOST)
  set(CPACK_COMPONENT_DEVELOPMENT_DEPENDS libraries)
endif()
set(CPACK_COMPONENT_TOOLS_DEPENDS plugin)
set(CPACK_COMPONENT_DEBUG_DEPENDS plugin)

include(CPack)
