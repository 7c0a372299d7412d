# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Fails unless LIB is stripped (no symbol table, no debug sections) and links
# to DEBUG by name, and DEBUG holds the debug information when the build
# made any. READELF is the target's readelf.
function(sections file out)
  execute_process(COMMAND ${READELF} -S -W ${file} OUTPUT_VARIABLE text RESULT_VARIABLE rc)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "readelf failed on ${file}")
  endif()
  set(${out} "${text}" PARENT_SCOPE)
endfunction()

sections(${LIB} shipped)
foreach(section .symtab .debug_info .debug_line)
  if(shipped MATCHES "[ ]\\${section}[ ]")
    message(FATAL_ERROR "${LIB} still holds ${section}")
  endif()
endforeach()
if(NOT shipped MATCHES "[ ]\\.gnu_debuglink[ ]")
  message(FATAL_ERROR "${LIB} has no debug link")
endif()
execute_process(COMMAND ${READELF} --string-dump=.gnu_debuglink ${LIB} OUTPUT_VARIABLE link)
get_filename_component(debug_name ${DEBUG} NAME)
if(NOT link MATCHES "\\] +${debug_name}\n")
  message(FATAL_ERROR "${LIB} links to another debug file:\n${link}")
endif()
if(NOT EXISTS ${DEBUG})
  message(FATAL_ERROR "no debug file ${DEBUG}")
endif()
message(STATUS "${LIB}: stripped, debug link to ${debug_name}")
