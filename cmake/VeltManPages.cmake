# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# The manual pages of velt-host and velt-peer, made at build time from each
# program's own --help and --version, so that they cannot drift from it.
set(VELT_MAN_PAGES "")

function(velt_man_page program summary see_also)
  set(page ${VELT_MAN_DIR}/${program}.1)
  add_custom_command(OUTPUT ${page} ${page}.gz
    COMMAND ${CMAKE_COMMAND} -DPROGRAM=$<TARGET_FILE:${program}> -DNAME=${program}
            "-DSUMMARY=${summary}" "-DSEE_ALSO=${see_also}" -DOUTPUT=${page}
            -P ${PROJECT_SOURCE_DIR}/cmake/ManPage.cmake
    DEPENDS ${program} ${PROJECT_SOURCE_DIR}/cmake/ManPage.cmake
    COMMENT "Writing the manual page of ${program}"
    VERBATIM)
  set(VELT_MAN_PAGES ${VELT_MAN_PAGES} ${page} PARENT_SCOPE)
  install(FILES ${page}.gz DESTINATION ${CMAKE_INSTALL_MANDIR}/man1 COMPONENT tools)
endfunction()

velt_man_page(velt-host "console host for the Velt Conduit plug-in" "velt-peer")
velt_man_page(velt-peer "TCP and UDP device simulator for Velt Conduit channels" "velt-host")
add_custom_target(velt_man_pages ALL DEPENDS ${VELT_MAN_PAGES})
