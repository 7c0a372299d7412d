# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Fails unless the manual page PAGE renders without a groff warning and shows
# every line of PROGRAM's --help, as printed, and its --version in the footer.
find_program(GROFF groff REQUIRED)
execute_process(COMMAND ${PROGRAM} --help OUTPUT_VARIABLE help RESULT_VARIABLE rc)
if(NOT rc EQUAL 0)
  message(FATAL_ERROR "${PROGRAM} --help failed")
endif()
execute_process(COMMAND ${PROGRAM} --version OUTPUT_VARIABLE version)
string(STRIP "${version}" version)

# Plain ASCII, no overstriking, lines long enough never to be broken.
execute_process(COMMAND ${GROFF} -man -Tascii -ww -P-cbou -rLL=250n -rLT=250n ${PAGE}
  OUTPUT_VARIABLE page ERROR_VARIABLE warnings RESULT_VARIABLE rc)
if(NOT rc EQUAL 0 OR NOT warnings STREQUAL "")
  message(FATAL_ERROR "groff on ${PAGE} (${rc}):\n${warnings}")
endif()

string(REPLACE ";" "\\;" help "${help}")
string(REPLACE "\n" ";" lines "${help}")
set(count 0)
foreach(line IN LISTS lines)
  if(line STREQUAL "")
    continue()
  endif()
  # Sections indent their text by seven columns.
  string(FIND "${page}" "\n       ${line}\n" at)
  if(at EQUAL -1)
    message(FATAL_ERROR "${PAGE} does not show the help line:\n${line}\n--- rendered:\n${page}")
  endif()
  math(EXPR count "${count} + 1")
endforeach()
if(count LESS 5)
  message(FATAL_ERROR "${PROGRAM} --help printed only ${count} lines")
endif()
if(NOT page MATCHES "\n${version} +[A-Z-]+\\(1\\)\n")
  message(FATAL_ERROR "${PAGE} does not name ${version} in its footer:\n${page}")
endif()
message(STATUS "${PAGE}: ${count} help lines, ${version}")
