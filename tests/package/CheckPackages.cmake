# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Reads back the Debian packages in DIR with dpkg-deb: each one's name,
# version, dependencies (-I) and files (-c) must be the expected ones.
# PREFIX, LIBDIR and PLUGINDIR give the install layout; STATIC says the
# plug-in carries the C++ runtime.
find_program(DPKG_DEB dpkg-deb REQUIRED)
string(REGEX REPLACE "^/" "" prefix "${PREFIX}")
set(lib ./${prefix}/${LIBDIR})

function(control deb field out)
  execute_process(COMMAND ${DPKG_DEB} -f ${deb} ${field} OUTPUT_VARIABLE value RESULT_VARIABLE rc)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "dpkg-deb -f failed on ${deb}")
  endif()
  string(STRIP "${value}" value)
  set(${out} "${value}" PARENT_SCOPE)
endfunction()

# PACKAGE must exist once, with the version, the dependencies matching each
# DEPENDS expression and none matching an ABSENT one, and every file of FILES
# (regular expressions over the dpkg-deb -c paths).
function(check_package package)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "DEPENDS;ABSENT;FILES")
  file(GLOB debs ${DIR}/${package}_*.deb)
  list(LENGTH debs count)
  if(NOT count EQUAL 1)
    message(FATAL_ERROR "expected one package ${package} in ${DIR}, found ${count}")
  endif()
  control(${debs} Package name)
  control(${debs} Version version)
  control(${debs} Depends depends)
  if(NOT name STREQUAL package OR NOT version STREQUAL VERSION)
    message(FATAL_ERROR "${debs}: package ${name} ${version}")
  endif()
  foreach(expected IN LISTS arg_DEPENDS)
    if(NOT depends MATCHES "(^|, )${expected}(,|$)")
      message(FATAL_ERROR "${package} does not depend on ${expected}: ${depends}")
    endif()
  endforeach()
  foreach(unwanted IN LISTS arg_ABSENT)
    if(depends MATCHES "${unwanted}")
      message(FATAL_ERROR "${package} depends on ${unwanted}: ${depends}")
    endif()
  endforeach()
  execute_process(COMMAND ${DPKG_DEB} -c ${debs} OUTPUT_VARIABLE listing)
  foreach(path IN LISTS arg_FILES)
    if(NOT listing MATCHES " ${path}(\n| -> )")
      message(FATAL_ERROR "${package} lacks ${path}:\n${listing}")
    endif()
  endforeach()
  message(STATUS "${package} ${version}: ${depends}")
endfunction()

set(docs ./${prefix}/share/doc)
set(exact "\\(= ${VERSION}\\)")
set(plugin_absent "libstdc")
if(NOT STATIC)
  set(plugin_absent "libz")
endif()
check_package(velt-conduit
  DEPENDS "libc6 \\(>= [0-9.]+\\)"
  ABSENT "zlib" ${plugin_absent}
  FILES ${lib}/velt/libvelt.so ${docs}/velt-conduit/copyright ${docs}/velt-conduit/changelog.gz
        ${docs}/velt-conduit/LICENSE ${docs}/velt-conduit/docs/integrators-guide.md)
check_package(libvelt-host1
  DEPENDS "libc6 \\(>= [0-9.]+\\)" "libstdc[+][+]6 \\(>= [0-9.]+\\)" "zlib1g \\(>= [0-9.:]+\\)"
  FILES ${lib}/libvelt_host.so.1 ${lib}/libvelt_host.so.${VERSION}
        ${docs}/libvelt-host1/copyright)
check_package(velt-conduit-dev
  DEPENDS "libvelt-host1 ${exact}" "zlib1g-dev"
  FILES ${lib}/libvelt_host.so ${lib}/libvelt_host.a
        ./${prefix}/include/velt/hostapi/IProtocol7.h ./${prefix}/include/velt/host/PluginLoader.h
        ${lib}/cmake/Velt/VeltConfig.cmake ${lib}/cmake/Velt/VeltConfigVersion.cmake
        ${lib}/pkgconfig/velt-host.pc ${lib}/pkgconfig/velt-hostapi.pc
        ${docs}/velt-conduit-dev/copyright)
check_package(velt-conduit-tools
  DEPENDS "velt-conduit ${exact}" "libedit2 \\(>= [0-9.:-]+\\)"
  FILES ./${prefix}/bin/velt-host ./${prefix}/bin/velt-peer
        ./${prefix}/share/man/man1/velt-host.1.gz ./${prefix}/share/man/man1/velt-peer.1.gz
        ${docs}/velt-conduit-tools/copyright)
check_package(velt-conduit-dbgsym
  DEPENDS "velt-conduit ${exact}"
  FILES "./${prefix}/lib/debug/.build-id/[0-9a-f][0-9a-f]/[0-9a-f]+[.]debug")
