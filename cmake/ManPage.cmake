# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Writes the manual page OUTPUT (and OUTPUT.gz) of PROGRAM, named NAME, from
# what the program itself prints for --version and --help:
#   NAME      NAME \- SUMMARY
#   SYNOPSIS  the help text's usage lines (its first line and the indented
#             lines right after it)
#   DESCRIPTION and OPTIONS  the rest of the help text, line for line
#   SEE ALSO  SEE_ALSO(1)
# Lines keep their layout (no filling), so every help line reads the same in
# the rendered page.
function(run_program argument out)
  execute_process(COMMAND ${PROGRAM} ${argument} RESULT_VARIABLE rc
    OUTPUT_VARIABLE text ERROR_VARIABLE err)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "${PROGRAM} ${argument} failed (${rc}): ${err}")
  endif()
  set(${out} "${text}" PARENT_SCOPE)
endfunction()

# roff: a backslash is written \e, and a line that starts with a dot or an
# apostrophe would be a request, so it starts with the zero-width \& instead.
# A hyphen is written \- so that it renders and is searched as one.
function(escape_line line out)
  string(REPLACE "\\" "\\e" line "${line}")
  string(REPLACE "-" "\\-" line "${line}")
  if(line MATCHES "^[.']")
    set(line "\\&${line}")
  endif()
  set(${out} "${line}" PARENT_SCOPE)
endfunction()

run_program(--version version)
string(STRIP "${version}" version)
run_program(--help help)
string(REGEX REPLACE "\n$" "" help "${help}")
# A semicolon would split the text into list items.
string(REPLACE ";" "\\;" help "${help}")
string(REPLACE "\n" ";" lines "${help}")

string(TOUPPER "${NAME}" title)
string(REPLACE "-" "\\-" name_roff "${NAME}")
set(page ".TH ${title} 1 \"\" \"${version}\" \"User Commands\"\n")
string(APPEND page ".SH NAME\n${name_roff} \\- ${SUMMARY}\n")
set(section SYNOPSIS)
string(APPEND page ".SH SYNOPSIS\n.nf\n")
set(first TRUE)
foreach(line IN LISTS lines)
  # The usage lines come first: the first line and the indented ones after it.
  if(section STREQUAL "SYNOPSIS" AND NOT first AND NOT line MATCHES "^ ")
    set(section DESCRIPTION)
    string(APPEND page ".fi\n.SH DESCRIPTION\n.nf\n")
    if(line STREQUAL "")
      continue()
    endif()
  endif()
  set(first FALSE)
  escape_line("${line}" line)
  if(line STREQUAL "")
    string(APPEND page ".sp\n")
  else()
    string(APPEND page "${line}\n")
  endif()
endforeach()
escape_line("${SEE_ALSO}" see_also)
string(APPEND page ".fi\n.SH \"SEE ALSO\"\n.BR ${see_also} (1)\n")
file(WRITE "${OUTPUT}" "${page}")
# gzip -n: no name or time stamp, so the same page gives the same bytes.
execute_process(COMMAND gzip -9 -n -c "${OUTPUT}" OUTPUT_FILE "${OUTPUT}.gz" RESULT_VARIABLE rc)
if(NOT rc EQUAL 0)
  message(FATAL_ERROR "gzip failed on ${OUTPUT}")
endif()
