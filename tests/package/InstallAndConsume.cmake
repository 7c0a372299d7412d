# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Installs the build BUILD into the staging prefix WORK/stage, checks what
# landed where, runs the installed velt-host, and builds and runs the outside
# project CONSUMER against the staged install twice: found with
# find_package(Velt), and found with pkg-config.
set(stage ${WORK}/stage)
file(REMOVE_RECURSE ${WORK})
file(MAKE_DIRECTORY ${WORK})

function(run)
  execute_process(COMMAND ${ARGN} RESULT_VARIABLE rc OUTPUT_VARIABLE out ERROR_VARIABLE err)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "failed (${rc}): ${ARGN}\n${out}\n${err}")
  endif()
  set(run_output "${out}" PARENT_SCOPE)
endfunction()

function(expect_output expected)
  if(NOT run_output STREQUAL expected)
    message(FATAL_ERROR "expected:\n${expected}\ngot:\n${run_output}")
  endif()
endfunction()

run(${CMAKE_COMMAND} --install ${BUILD} --prefix ${stage})

foreach(file
    ${BINDIR}/velt-host ${BINDIR}/velt-peer
    ${PLUGINDIR}/libvelt.so
    ${LIBDIR}/libvelt_host.so.${VERSION} ${LIBDIR}/libvelt_host.a
    include/velt/hostapi/IProtocol7.h include/velt/host/PluginLoader.h
    ${LIBDIR}/cmake/Velt/VeltConfig.cmake ${LIBDIR}/cmake/Velt/VeltConfigVersion.cmake
    ${LIBDIR}/cmake/Velt/VeltTargets.cmake
    ${LIBDIR}/pkgconfig/velt-hostapi.pc ${LIBDIR}/pkgconfig/velt-host.pc
    ${MANDIR}/man1/velt-host.1.gz ${MANDIR}/man1/velt-peer.1.gz
    share/doc/velt-conduit/LICENSE share/doc/velt-conduit/copyright)
  if(NOT EXISTS ${stage}/${file})
    message(FATAL_ERROR "not installed: ${file}")
  endif()
endforeach()
# The shared host library's SONAME link and development link.
foreach(link libvelt_host.so.1 libvelt_host.so)
  if(NOT IS_SYMLINK ${stage}/${LIBDIR}/${link})
    message(FATAL_ERROR "not installed as a link: ${LIBDIR}/${link}")
  endif()
endforeach()
file(GLOB_RECURSE debug_files ${stage}/lib/debug/.build-id/*.debug)
list(LENGTH debug_files debug_count)
if(NOT debug_count EQUAL 1)
  message(FATAL_ERROR "expected the plug-in's one debug file, found: ${debug_files}")
endif()

# The installed velt-host finds the installed plug-in by itself.
run(${stage}/${BINDIR}/velt-host --version)
expect_output("velt-host ${VERSION}\n")
run(${stage}/${BINDIR}/velt-host info)
if(NOT run_output MATCHES "^Protocol: VELT \\(472\\) v\\.112\n")
  message(FATAL_ERROR "velt-host info:\n${run_output}")
endif()

set(expected "Velt Conduit\nProtocol: VELT (472) v.112\nheld after unload: 0\n")
foreach(way cmake pkg-config)
  set(build ${WORK}/consumer-${way})
  run(${CMAKE_COMMAND} -E env PKG_CONFIG_PATH=${stage}/${LIBDIR}/pkgconfig
      ${CMAKE_COMMAND} -S ${CONSUMER} -B ${build} -G ${GENERATOR}
      -DCMAKE_CXX_COMPILER=${CXX} -DCMAKE_PREFIX_PATH=${stage} -DVELT_CONSUME_WITH=${way})
  run(${CMAKE_COMMAND} --build ${build})
  run(${build}/consumer)
  expect_output("${expected}")
  if(way STREQUAL "cmake")
    run(${build}/consumer_static)
    expect_output("${expected}")
  endif()
  message(STATUS "consumer found Velt with ${way}: ${run_output}")
endforeach()
