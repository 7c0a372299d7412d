# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Runs lintian over every Debian package in DIR; any error fails. Warnings
# are printed for the record.
file(GLOB debs ${DIR}/*.deb)
if(debs STREQUAL "")
  message(FATAL_ERROR "no packages in ${DIR}")
endif()
execute_process(COMMAND ${LINTIAN} --no-cfg --fail-on error ${debs}
  OUTPUT_VARIABLE out ERROR_VARIABLE err RESULT_VARIABLE rc)
message("${out}${err}")
if(NOT rc EQUAL 0)
  message(FATAL_ERROR "lintian found errors (${rc})")
endif()
