# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Splits a built ELF file INPUT into a stripped copy and its debug
# information, in OUTPUT_DIR: NAME (stripped, with a debug link to the
# other), NAME.debug, and NAME.build-id (the build identifier in hexadecimal,
# which names the debug file once installed under lib/debug/.build-id/).
# OBJCOPY and READELF are the target's binary tools.
get_filename_component(name "${INPUT}" NAME)
file(MAKE_DIRECTORY "${OUTPUT_DIR}")
set(stripped "${OUTPUT_DIR}/${name}")
set(debug "${OUTPUT_DIR}/${name}.debug")

function(run)
  execute_process(COMMAND ${ARGN} RESULT_VARIABLE rc OUTPUT_VARIABLE out ERROR_VARIABLE err)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "${ARGN} failed: ${err}")
  endif()
  set(run_output "${out}" PARENT_SCOPE)
endfunction()

run(${READELF} -n "${INPUT}")
if(NOT run_output MATCHES "Build ID: ([0-9a-f]+)")
  message(FATAL_ERROR "${INPUT} has no build identifier (link it with --build-id)")
endif()
set(id "${CMAKE_MATCH_1}")

run(${OBJCOPY} --only-keep-debug "${INPUT}" "${debug}")
# The debug link records the debug file's name and checksum, so it is made
# from the debug file as written.
run(${OBJCOPY} --strip-unneeded "--add-gnu-debuglink=${debug}" "${INPUT}" "${stripped}.tmp")
file(RENAME "${stripped}.tmp" "${stripped}")
file(WRITE "${OUTPUT_DIR}/${name}.build-id" "${id}")
